#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace vexa::client {

/// The length of UTF-8 text as the service counts it: in UTF-16 units.
std::size_t utf16Length(std::string_view text);

/// The text itself, or if it is no UTF-8, the text that it is in Latin-1.
std::string asUtf8(std::string_view text);

enum class Tabs { Escaped, Kept };

/// UTF-8 text that a terminal shows and that does nothing to it: hidden characters are written as \xNN,
/// \uNNNN or \UNNNNNNNN.
std::string printable(std::string_view text, Tabs tabs = Tabs::Escaped);

/// The same JSON text on one line, its hidden characters in JSON's own notation.
std::string withoutHidden(std::string_view json);

/// How many columns of a terminal printable UTF-8 text takes.
int columnsOf(std::string_view text);

/// Printable UTF-8 text where it fits into so many columns; else the longest beginning that does with the
/// ellipsis behind it.
std::string cutToColumns(std::string_view text, int columns, const std::string& ellipsis);

/// The text between double quotes.
std::string inQuotes(std::string_view text);

/// Rows of cells as lines: columns as wide as their widest cell, two blanks between them, no blanks at the
/// end. Cells are made printable.
std::vector<std::string> alignedLines(const std::vector<std::vector<std::string>>& rows);

/// "1 channel", "2 channels".
std::string counted(std::size_t count, const std::string& noun);

}  // namespace vexa::client
