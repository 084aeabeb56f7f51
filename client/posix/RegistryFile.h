#pragma once

#include <json/value.h>

#include "client/MachineFolder.h"

namespace vexa::client {

/// The whole registry of a simulated machine: key paths to values.
Json::Value readRegistry(const MachineFolder& machine);

inline constexpr const char* kVexaKey = "HKEY_CURRENT_USER\\Software\\Korvane\\Vexa";

}  // namespace vexa::client
