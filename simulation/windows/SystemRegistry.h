#pragma once

#include <json/value.h>

#include <optional>
#include <string>
#include <vector>

#include "simulation/scenario/Scenario.h"

namespace vexa::simulation {

// What a simulated machine has in the registry of the system. Any thread.

/// Replaces the class key of the network adapters. False if it can't be written.
bool writeClassKey(const std::vector<ClassKeyEntry>& entries);

/// Sets or removes the user's choice whether hotspots are joined by themselves. False if that fails.
bool writeAutoConnect(const std::optional<std::string>& text);

/// The values of the product's key, by the path of the key; an empty object if there is no such key.
Json::Value readProductKey();

}  // namespace vexa::simulation
