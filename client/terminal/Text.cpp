#include "client/terminal/Text.h"

#include <algorithm>
#include <optional>

#include "client/terminal/CharacterWidth.h"
#include "client/terminal/HiddenCharacters.h"
#include "text/Utf8.h"

namespace vexa::client {

namespace {

constexpr std::size_t kColumnGap = 2;
// What lies below is hidden by JSON's own rules.
constexpr char32_t kDelete = 0x7F;

/// The first character of the text, and what comes behind it; nothing at its end, and where none begins.
std::optional<Utf8Character> takeCharacter(std::string_view& rest) {
    if (rest.empty()) return std::nullopt;
    const Utf8Character character = firstUtf8Character(rest);
    if (character.length == 0) return std::nullopt;
    rest.remove_prefix(character.length);
    return character;
}

std::string inHex(char32_t value, int digits) {
    constexpr const char* kDigits = "0123456789abcdef";
    std::string text;
    for (int shift = 4 * (digits - 1); shift >= 0; shift -= 4)
        text += kDigits[(value >> shift) & 0xFU];
    return text;
}

std::string escaped(char32_t value) {
    if (value < 0x100) return "\\x" + inHex(value, 2);
    return value < 0x10000 ? "\\u" + inHex(value, 4) : "\\U" + inHex(value, 8);
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
        if (!isHidden(point) || (point == U'\t' && tabs == Tabs::Kept))
            appendUtf8(shown, point);
        else
            shown += escaped(point);
    }
    return shown;
}

std::string withoutHidden(std::string_view json) {
    std::string text;
    while (!json.empty()) {
        const Utf8Character character = firstUtf8Character(json);
        const std::size_t length = std::max<std::size_t>(character.length, 1);
        std::u16string units;
        if (character.codePoint >= kDelete && isHidden(character.codePoint))
            appendUtf16(units, character.codePoint);
        for (const char16_t unit : units)
            text += "\\u" + inHex(unit, 4);
        if (units.empty()) text += json.substr(0, length);
        json.remove_prefix(length);
    }
    return text;
}

int columnsOf(std::string_view text) {
    int columns = 0;
    while (const auto character = takeCharacter(text))
        columns += characterWidth(character->codePoint);
    return columns;
}

std::string cutToColumns(std::string_view text, int columns, const std::string& ellipsis) {
    if (columnsOf(text) <= columns) return std::string(text);
    columns = std::max(columns - columnsOf(ellipsis), 0);
    std::string cut;
    while (const auto character = takeCharacter(text)) {
        columns -= characterWidth(character->codePoint);
        if (columns < 0) break;
        appendUtf8(cut, character->codePoint);
    }
    return cut + ellipsis;
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
