#pragma once

#include <json/value.h>

#include <cstddef>
#include <cstdint>

#include "platform/WlanApi.h"
#include "simulation/Machine.h"
#include "simulation/scenario/JsonPlace.h"

namespace vexa::simulation {

// What actions read out of their members, which have been checked.

JsonPlace memberOf(const Json::Value& action, const char* name);

/// A number, or `otherwise` if the member is absent.
std::uint32_t unsignedOf(const Json::Value& action, const char* name, std::uint32_t otherwise);

/// The bytes of a text, which is UTF-8.
Bytes bytesOfText(const Json::Value& action, const char* name);

Bytes dataOf(const Json::Value& action);

/// The adapter that the action names, the first if it names none. Throws JsonFault: there may be none.
std::size_t existingAdapterOf(Machine& machine, const Json::Value& action);

/// The network that the action names. Throws JsonFault if there is none.
Network existingNetworkOf(Machine& machine, const Json::Value& action);

/// The adapter that messages of the modules come from; all zero if the machine has none.
GUID usualGuid(Machine& machine);
GUID guidOf(Machine& machine, const Json::Value& action);

}  // namespace vexa::simulation
