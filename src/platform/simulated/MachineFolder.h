#pragma once

#include <filesystem>

namespace vexa::platform {

/// The folder of the simulated machine that this process runs on, as the environment names it. Need not
/// exist.
std::filesystem::path machineFolder();

}  // namespace vexa::platform
