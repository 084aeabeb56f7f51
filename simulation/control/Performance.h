#pragma once

#include <json/value.h>

namespace vexa::simulation {

class Machine;

/// Carries out an action or a query of the control channel and gives its answer. Returns when the action's
/// own notifications have been delivered. Any thread, but not a callback of this machine.
Json::Value perform(Machine& machine, const Json::Value& message);

}  // namespace vexa::simulation
