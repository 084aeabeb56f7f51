#pragma once

#include <json/value.h>

#include <optional>

#include "client/MachineFolder.h"

namespace vexa::client {

// What the service and its clients share in the registry of a machine.

/// The whole registry: key paths to values.
Json::Value readRegistry(const MachineFolder& machine);

inline constexpr const char* kVexaKey = "HKEY_CURRENT_USER\\Software\\Korvane\\Vexa";

/// The method of the connection that the service has made: kMethodTls, kMethodTtls, or 0 if there is none of
/// its own. Nothing before it has ever written it.
std::optional<int> readConnectionMethod(const MachineFolder& machine);

}  // namespace vexa::client
