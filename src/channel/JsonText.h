#pragma once

#include <json/value.h>

#include <optional>
#include <string>
#include <string_view>

namespace vexa {

/// The form in which every JSON text leaves this process: members sorted, indented by 3, a line end at the
/// end.
std::string toStyledText(const Json::Value& value);

/// Appends a text in its quotes as the above writes it, at a fraction of the cost. What is no UTF-8 becomes
/// U+FFFD, one for each byte.
void appendQuoted(std::string& json, std::string_view text);

/// Comments are allowed and the root may be anything, whatever comes behind it. Text that isn't JSON and text
/// nested too deeply give null: half a command is none.
Json::Value parseJsonText(std::string_view text);

/// The same for the bytes of a message, up to the first NUL. Nothing if memory runs out.
std::optional<Json::Value> parseReceived(std::string_view bytes);

/// A member as text: a string as it stands, a boolean as true or false, null or no member as empty. Nothing
/// for other types.
std::optional<std::string> readText(const Json::Value& object, const char* member);

}  // namespace vexa
