#include "client/terminal/LineFit.h"

#include <algorithm>

#include "client/terminal/Terminal.h"
#include "client/terminal/Text.h"

namespace vexa::client {

namespace {

constexpr int kNarrowest = 4;

int widest(const std::vector<std::string>& texts) {
    int columns = 0;
    for (const std::string& text : texts)
        columns = std::max(columns, columnsOf(text));
    return columns;
}

}  // namespace

std::optional<int> lineRoom() {
    const auto size = isOutputTerminal() ? terminalSize() : std::nullopt;
    return size ? std::optional(size->columns) : std::nullopt;
}

void fitToColumns(std::vector<std::vector<std::string>>& rows, const std::vector<std::size_t>& cut,
                  int columns, const std::string& ellipsis) {
    for (int most = std::max(columns, kNarrowest); most >= kNarrowest && widest(alignedLines(rows)) > columns;
         --most) {
        for (auto& row : rows) {
            for (const std::size_t column : cut)
                row[column] = cutToColumns(printable(row[column]), most, ellipsis);
        }
    }
}

std::vector<std::string> wrapped(const std::string& text, int columns, std::size_t indent) {
    std::vector<std::string> lines;
    std::string line;
    bool hasWord = false;
    std::size_t begin = 0;
    while (begin < text.size()) {
        const std::size_t word = std::min(text.find_first_not_of(' ', begin), text.size());
        const std::size_t end = std::min(text.find(' ', word), text.size());
        if (hasWord && columnsOf(line + text.substr(begin, end - begin)) > columns) {
            lines.push_back(line);
            line.assign(indent, ' ');
            begin = word;
        }
        line += text.substr(begin, end - begin);
        hasWord = true;
        begin = end;
    }
    lines.push_back(line);
    return lines;
}

}  // namespace vexa::client
