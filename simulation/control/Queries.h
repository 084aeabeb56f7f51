#pragma once

#include <json/value.h>

namespace vexa::simulation {

class Machine;

/// The result of a query of the control channel. Throws JsonFault for one that isn't known.
Json::Value runQuery(Machine& machine, const Json::Value& message);

}  // namespace vexa::simulation
