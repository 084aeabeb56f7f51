#pragma once

#include <json/value.h>

#include <string>
#include <vector>

namespace vexa::client {

/// Prints what a command has found or done: as JSON on one line, or in words. False once nobody reads it.
bool print(bool json, const Json::Value& value, const std::vector<std::string>& lines);
bool print(bool json, const Json::Value& value, const std::string& sentence);

}  // namespace vexa::client
