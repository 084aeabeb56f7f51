#pragma once

#include <json/value.h>

#include <string>
#include <string_view>

#include "engine/Story.h"

namespace vexa::test {

/// Sends a command of the hotspot port and gives the list of credentials that answers it: "2 b.example,
/// 1 a.example" and a line feed, by id and name, or "null".
std::string list(World& world, const std::string& command, const std::string& data = "");

/// What ADD_CREDENTIAL takes, for a realm that is also the name.
std::string ttlsData(const std::string& realm);
std::string tlsData(const std::string& realm);

Json::Value parsed(const std::string& json);

/// How often a text stands in another, and a blank.
std::string count(std::string_view text, std::string_view part);

/// Edits the file by hand.
void writeConfig(World& world, std::string_view content);

}  // namespace vexa::test
