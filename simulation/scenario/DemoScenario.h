#pragma once

#include <string_view>

namespace vexa::simulation {

/// The scenario of a machine that was given none, as JSON: some 20 s in an office, with a microwave oven.
std::string_view demoScenario();

}  // namespace vexa::simulation
