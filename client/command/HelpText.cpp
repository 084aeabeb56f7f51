#include "client/command/HelpText.h"

#include <sstream>
#include <string_view>
#include <utility>

#include "client/terminal/Text.h"

namespace vexa::client {

namespace {

constexpr std::size_t kDescriptions = 30;  // the parser's own column
constexpr int kFewestWithColumn = 50;
constexpr std::string_view kOffMark = "{false}";  // behind the name of a flag that turns another one off

/// The blanks before what goes on in the next line.
std::string hangingIndent(const std::string& line, int columns) {
    if (!line.starts_with("  ")) return "";
    return std::string(columns < kFewestWithColumn ? 4 : kDescriptions, ' ');
}

void wrap(std::string& text, const std::string& line, int columns) {
    const std::string indent = hangingIndent(line, columns);
    std::string row = line.substr(0, line.find_first_not_of(' '));
    bool isBegun = false;
    std::istringstream rest(line.substr(row.size()));
    for (std::string word, blanks; std::getline(rest, word, ' ');) {
        if (word.empty()) {
            blanks += ' ';
            continue;
        }
        const std::string more = (isBegun ? " " : "") + std::exchange(blanks, "") + word;
        if (isBegun && columnsOf(row + more) > columns) {
            text += row + '\n';
            row = indent + word;
        } else {
            row += more;
        }
        isBegun = true;
    }
    text += row + '\n';
}

}  // namespace

std::string helpText(const std::string& text, std::optional<int> columns) {
    std::istringstream lines(text);
    std::string shown;
    for (std::string line; std::getline(lines, line);) {
        if (const auto mark = line.find(kOffMark); mark != line.npos)
            line.replace(mark, kOffMark.size(), kOffMark.size(), ' ');
        if (columns && columnsOf(line) > *columns)
            wrap(shown, line, *columns);
        else
            shown += line + '\n';
    }
    return shown;
}

}  // namespace vexa::client
