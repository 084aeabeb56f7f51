#include "client/terminal/Text.h"

#include <algorithm>
#include <optional>

#include "client/terminal/CharacterWidth.h"
#include "text/Utf8.h"

namespace vexa::client {

namespace {

constexpr std::size_t kColumnGap = 2;

/// The first character of the text, and what comes behind it; nothing at its end, and where none begins.
std::optional<Utf8Character> takeCharacter(std::string_view& rest) {
    if (rest.empty()) return std::nullopt;
    const Utf8Character character = firstUtf8Character(rest);
    if (character.length == 0) return std::nullopt;
    rest.remove_prefix(character.length);
    return character;
}

bool isControl(char32_t value) {
    return value < 0x20 || (value >= 0x7F && value < 0xA0);
}

std::string escaped(char32_t value) {
    constexpr const char* kDigits = "0123456789abcdef";
    return {'\\', 'x', kDigits[(value >> 4U) & 0xFU], kDigits[value & 0xFU]};
}

}  // namespace

std::size_t utf16Length(std::string_view text) {
    std::u16string units;
    while (const auto character = takeCharacter(text))
        appendUtf16(units, character->codePoint);
    return units.size();
}

std::string asUtf8(std::string_view text) {
    if (isValidUtf8(text)) return std::string(text);
    std::string converted;
    for (const char byte : text)
        appendUtf8(converted, static_cast<unsigned char>(byte));
    return converted;
}

std::string printable(std::string_view text, Tabs tabs) {
    const std::string whole = asUtf8(text);
    std::string_view rest = whole;
    std::string shown;
    while (const auto character = takeCharacter(rest)) {
        const char32_t point = character->codePoint;
        if (!isControl(point) || (point == U'\t' && tabs == Tabs::Kept))
            appendUtf8(shown, point);
        else
            shown += escaped(point);
    }
    return shown;
}

int columnsOf(std::string_view text) {
    int columns = 0;
    while (const auto character = takeCharacter(text))
        columns += characterWidth(character->codePoint);
    return columns;
}

std::string cutToColumns(std::string_view text, int columns) {
    std::string cut;
    while (const auto character = takeCharacter(text)) {
        columns -= characterWidth(character->codePoint);
        if (columns < 0) break;
        appendUtf8(cut, character->codePoint);
    }
    return cut;
}

std::string inQuotes(std::string_view text) {
    return '"' + printable(text) + '"';
}

std::vector<std::string> alignedLines(const std::vector<std::vector<std::string>>& rows) {
    std::vector<int> widths;
    for (const auto& row : rows) {
        widths.resize(std::max(widths.size(), row.size()));
        for (std::size_t i = 0; i < row.size(); ++i)
            widths[i] = std::max(widths[i], columnsOf(printable(row[i])));
    }
    std::vector<std::string> lines;
    for (const auto& row : rows) {
        std::string line;
        for (std::size_t i = 0; i < row.size(); ++i) {
            const std::string cell = printable(row[i]);
            line += cell;
            line.append(static_cast<std::size_t>(widths[i] - columnsOf(cell)) + kColumnGap, ' ');
        }
        line.erase(line.find_last_not_of(' ') + 1);
        lines.push_back(std::move(line));
    }
    return lines;
}

std::string counted(std::size_t count, const std::string& noun) {
    return std::to_string(count) + " " + noun + (count == 1 ? "" : "s");
}

}  // namespace vexa::client
