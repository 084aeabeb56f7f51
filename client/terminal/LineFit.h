#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <vector>

namespace vexa::client {

/// How many columns a line may take so that the terminal shows it as one; nothing where standard output goes
/// elsewhere.
std::optional<int> lineRoom();

/// Shortens cells of these columns, the widest first, until `alignedLines` of the rows take no more than so
/// many columns, or all of them are narrow.
void fitToColumns(std::vector<std::vector<std::string>>& rows, const std::vector<std::size_t>& cut,
                  int columns, const std::string& ellipsis);

/// The text in lines of no more than so many columns, broken at blanks; all but the first stand behind so
/// many blanks.
std::vector<std::string> wrapped(const std::string& text, int columns, std::size_t indent);

}  // namespace vexa::client
