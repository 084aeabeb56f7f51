#pragma once

#include <json/value.h>

#include <string>
#include <vector>

#include "client/output/OutputOptions.h"

namespace vexa::client {

/// Prints what a command has found or done, as the user wants it; `lines` are its own words. False once
/// nobody reads it.
bool print(const OutputOptions& options, const Json::Value& value, const std::vector<std::string>& lines);
bool print(const OutputOptions& options, const Json::Value& value, const std::string& sentence);

/// The same for a command that has no fields.
bool print(bool json, const Json::Value& value, const std::vector<std::string>& lines);
bool print(bool json, const Json::Value& value, const std::string& sentence);

}  // namespace vexa::client
