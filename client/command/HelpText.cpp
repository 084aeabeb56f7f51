#include "client/command/HelpText.h"

#include <sstream>
#include <string_view>
#include <vector>

#include "client/terminal/LineFit.h"

namespace vexa::client {

namespace {

constexpr std::size_t kDescriptions = 30;  // the parser's own column
constexpr int kFewestWithColumn = 50;
constexpr std::string_view kOffMark = "{false}";  // behind the name of a flag that turns another one off

std::size_t indentOf(const std::string& line, int columns) {
    if (!line.starts_with("  ")) return 0;
    return columns < kFewestWithColumn ? 4 : kDescriptions;
}

}  // namespace

std::string helpText(const std::string& text, std::optional<int> columns) {
    std::istringstream lines(text);
    std::string shown;
    for (std::string line; std::getline(lines, line);) {
        if (const auto mark = line.find(kOffMark); mark != line.npos)
            line.replace(mark, kOffMark.size(), kOffMark.size(), ' ');
        const auto rows =
            columns ? wrapped(line, *columns, indentOf(line, *columns)) : std::vector<std::string>{line};
        for (const std::string& row : rows)
            shown += row + '\n';
    }
    return shown;
}

}  // namespace vexa::client
