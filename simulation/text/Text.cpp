#include "simulation/text/Text.h"

#include <algorithm>

#include "text/TextConversion.h"
#include "text/Utf8.h"

namespace vexa::simulation {

namespace {

int digitValue(char c) {
    if (c >= '0' && c <= '9') return c - '0';
    if (c >= 'a' && c <= 'f') return c - 'a' + 10;
    if (c >= 'A' && c <= 'F') return c - 'A' + 10;
    return -1;
}

}  // namespace

std::u32string codePoints(std::string_view utf8) {
    std::u32string points;
    points.reserve(utf8.size());
    while (!utf8.empty()) {
        const Utf8Character character = firstUtf8Character(utf8);
        points += character.length == 0 ? static_cast<unsigned char>(utf8.front()) : character.codePoint;
        utf8.remove_prefix(std::max<std::size_t>(character.length, 1));
    }
    return points;
}

std::u16string utf16(std::string_view utf8) {
    std::u16string units;
    for (const char32_t point : codePoints(utf8))
        appendUtf16(units, point);
    return units;
}

std::string latin1(std::string_view utf8) {
    std::string bytes;
    for (const char32_t point : codePoints(utf8))
        bytes += point <= 0xFF ? static_cast<char>(point) : '?';
    return bytes;
}

std::string textOfBytes(std::span<const std::uint8_t> bytes) {
    std::string text;
    for (const char32_t point : codePoints(std::string(bytes.begin(), bytes.end())))
        appendUtf8(text, point);
    return text;
}

std::string hexText(std::span<const std::uint8_t> bytes) {
    constexpr std::string_view kDigits = "0123456789abcdef";
    std::string out;
    out.reserve(bytes.size() * 2);
    for (const std::uint8_t byte : bytes) {
        out.push_back(kDigits[byte >> 4]);
        out.push_back(kDigits[byte & 15]);
    }
    return out;
}

std::optional<Bytes> bytesFromHex(std::string_view hex) {
    if (hex.size() % 2 != 0) return std::nullopt;
    Bytes out;
    out.reserve(hex.size() / 2);
    for (std::size_t i = 0; i < hex.size(); i += 2) {
        const int high = digitValue(hex[i]);
        const int low = digitValue(hex[i + 1]);
        if (high < 0 || low < 0) return std::nullopt;
        out.push_back(static_cast<std::uint8_t>(high * 16 + low));
    }
    return out;
}

bool startsWithNoCase(std::string_view text, std::string_view prefix) {
    return compareNoCase(text.substr(0, prefix.size()), prefix) == 0;
}

}  // namespace vexa::simulation
