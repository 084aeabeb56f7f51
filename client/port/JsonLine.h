#pragma once

#include <json/value.h>

#include <optional>
#include <string>
#include <string_view>

namespace vexa::client {

/// The value as JSON on one line, without a line end.
std::string jsonLine(const Json::Value& value);

/// The text as a value; nothing if it is not JSON.
std::optional<Json::Value> parseJson(std::string_view text);

/// As parseJson(); nothing for any other value than an object.
std::optional<Json::Value> parseJsonObject(std::string_view text);

}  // namespace vexa::client
