#pragma once

#include <optional>
#include <string>

namespace vexa::client {

/// The parser's help as the user reads it, where lines have no more than so many columns wrapped between
/// words: descriptions stay in their column.
std::string helpText(const std::string& text, std::optional<int> columns);

}  // namespace vexa::client
