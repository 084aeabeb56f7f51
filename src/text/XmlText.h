#pragma once

#include <optional>
#include <string>

namespace vexa {

/// The text of an XML document out of the bytes of its file: in UTF-8, each line end one line feed. Nothing
/// if it isn't well-formed, or is in an encoding other than UTF-8, UTF-16, ISO-8859-1 and US-ASCII.
std::optional<std::string> xmlText(const std::string& content);

}  // namespace vexa
