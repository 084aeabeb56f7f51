#pragma once

#include <json/value.h>

#include <optional>
#include <string>
#include <string_view>

namespace vexa::simulation {

/// Strict JSON: no comments, nothing behind the value, no member twice. On a fault nothing, and `error` holds
/// one line about it.
std::optional<Json::Value> parseJson(std::string_view text, std::string& error);

/// One line.
std::string compactJson(const Json::Value& value);

/// Indented, with a line feed at the end, for files that people read.
std::string indentedJson(const Json::Value& value);

}  // namespace vexa::simulation
