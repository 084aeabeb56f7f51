#pragma once

#include <json/value.h>

#include <string>
#include <string_view>

namespace vexa {

/// The form in which every JSON text leaves this process: members sorted, indented by 3, a line end at the
/// end. To the byte what JsonCpp's styled writer gives, which clients know, for values without comments.
std::string toStyledText(const Json::Value& value);

/// Appends `text` as JSON shows a string: in quotes, and all but ASCII escaped.
void appendQuoted(std::string& out, std::string_view text);

/// The same as it stands within a string: in JSON that is a text of other JSON.
void appendQuotedTwice(std::string& out, std::string_view text);

}  // namespace vexa
