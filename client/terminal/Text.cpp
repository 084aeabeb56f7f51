#include "client/terminal/Text.h"

#include <algorithm>
#include <array>
#include <optional>

#include "client/terminal/CharacterWidth.h"

namespace vexa::client {

namespace {

constexpr char32_t kFirstSupplementary = 0x10000;
constexpr std::size_t kColumnGap = 2;

struct CodePoint {
    char32_t value;
    std::size_t bytes;
};

/// The forms of UTF-8 by their first byte, with the lowest value that may take so many bytes.
struct Form {
    unsigned char mask;
    unsigned char lead;
    std::size_t bytes;
    char32_t lowest;
};
constexpr std::array<Form, 4> kForms{{{0x80, 0x00, 1, 0},
                                      {0xE0, 0xC0, 2, 0x80},
                                      {0xF0, 0xE0, 3, 0x800},
                                      {0xF8, 0xF0, 4, kFirstSupplementary}}};

bool isScalar(char32_t value) {
    return value <= 0x10FFFF && (value < 0xD800 || value > 0xDFFF);
}

/// The code point at the beginning of the text; nothing if there is no well-formed one.
std::optional<CodePoint> firstCodePoint(std::string_view text) {
    if (text.empty()) return std::nullopt;
    const auto lead = static_cast<unsigned char>(text.front());
    const auto form = std::find_if(kForms.begin(), kForms.end(), [lead](const Form& candidate) {
        return (lead & candidate.mask) == candidate.lead;
    });
    if (form == kForms.end() || text.size() < form->bytes) return std::nullopt;
    auto value = static_cast<char32_t>(lead & static_cast<unsigned char>(~form->mask));
    for (const char next : text.substr(1, form->bytes - 1)) {
        if ((static_cast<unsigned char>(next) & 0xC0U) != 0x80U) return std::nullopt;
        value = (value << 6U) | (static_cast<unsigned char>(next) & 0x3FU);
    }
    if (value < form->lowest || !isScalar(value)) return std::nullopt;
    return CodePoint{value, form->bytes};
}

bool isControl(char32_t value) {
    return value < 0x20 || (value >= 0x7F && value < 0xA0);
}

std::string escaped(char32_t value) {
    constexpr const char* kDigits = "0123456789abcdef";
    return {'\\', 'x', kDigits[(value >> 4U) & 0xFU], kDigits[value & 0xFU]};
}

std::string fromLatin1(unsigned char byte) {
    if (byte < 0x80) return {static_cast<char>(byte)};
    return {static_cast<char>(0xC0U | (byte >> 6U)), static_cast<char>(0x80U | (byte & 0x3FU))};
}

}  // namespace

bool isUtf8(std::string_view text) {
    while (const auto point = firstCodePoint(text))
        text.remove_prefix(point->bytes);
    return text.empty();
}

std::size_t utf16Length(std::string_view text) {
    std::size_t length = 0;
    while (const auto point = firstCodePoint(text)) {
        length += point->value < kFirstSupplementary ? 1 : 2;
        text.remove_prefix(point->bytes);
    }
    return length;
}

std::string asUtf8(std::string_view text) {
    if (isUtf8(text)) return std::string(text);
    std::string converted;
    for (const char byte : text)
        converted += fromLatin1(static_cast<unsigned char>(byte));
    return converted;
}

std::string printable(std::string_view text, Tabs tabs) {
    const std::string whole = asUtf8(text);
    std::string_view rest = whole;
    std::string shown;
    while (const auto point = firstCodePoint(rest)) {
        const bool isKept = !isControl(point->value) || (point->value == U'\t' && tabs == Tabs::Kept);
        shown += isKept ? std::string(rest.substr(0, point->bytes)) : escaped(point->value);
        rest.remove_prefix(point->bytes);
    }
    return shown;
}

int columnsOf(std::string_view text) {
    int columns = 0;
    while (const auto point = firstCodePoint(text)) {
        columns += characterWidth(point->value);
        text.remove_prefix(point->bytes);
    }
    return columns;
}

std::string cutToColumns(std::string_view text, int columns) {
    std::string cut;
    while (const auto point = firstCodePoint(text)) {
        columns -= characterWidth(point->value);
        if (columns < 0) break;
        cut += text.substr(0, point->bytes);
        text.remove_prefix(point->bytes);
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
