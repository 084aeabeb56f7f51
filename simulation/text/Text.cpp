#include "simulation/text/Text.h"

#include <algorithm>
#include <array>

namespace vexa::simulation {

namespace {

struct Lead {
    std::uint8_t mask;
    std::uint8_t pattern;
    std::uint8_t following;
    char32_t lowest;
};

// The lowest code point of each length: a longer form of a smaller one is not valid.
constexpr std::array<Lead, 3> kLeads{{
    {0xE0, 0xC0, 1, 0x80},
    {0xF0, 0xE0, 2, 0x800},
    {0xF8, 0xF0, 3, 0x10000},
}};

std::uint8_t byteAt(std::string_view text, std::size_t index) {
    return static_cast<std::uint8_t>(text[index]);
}

bool isCodePoint(char32_t value) {
    return value < 0x110000 && (value < 0xD800 || value > 0xDFFF);
}

std::optional<char32_t> sequence(std::string_view text, std::size_t at, const Lead& lead) {
    if (text.size() - at <= lead.following) return std::nullopt;
    char32_t value = byteAt(text, at) & static_cast<std::uint8_t>(~lead.mask);
    for (std::size_t i = 1; i <= lead.following; ++i) {
        const std::uint8_t next = byteAt(text, at + i);
        if ((next & 0xC0) != 0x80) return std::nullopt;
        value = (value << 6) | (next & 0x3F);
    }
    if (value < lead.lowest || !isCodePoint(value)) return std::nullopt;
    return value;
}

int digitValue(char c) {
    if (c >= '0' && c <= '9') return c - '0';
    if (c >= 'a' && c <= 'f') return c - 'a' + 10;
    if (c >= 'A' && c <= 'F') return c - 'A' + 10;
    return -1;
}

char lower(char c) {
    return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c;
}

void appendUtf8(std::string& out, char32_t point) {
    const auto tail = [&](int shift) { out.push_back(static_cast<char>(0x80 | ((point >> shift) & 0x3F))); };
    if (point < 0x80) {
        out.push_back(static_cast<char>(point));
    } else if (point < 0x800) {
        out.push_back(static_cast<char>(0xC0 | (point >> 6)));
        tail(0);
    } else if (point < 0x10000) {
        out.push_back(static_cast<char>(0xE0 | (point >> 12)));
        tail(6);
        tail(0);
    } else {
        out.push_back(static_cast<char>(0xF0 | (point >> 18)));
        tail(12);
        tail(6);
        tail(0);
    }
}

}  // namespace

std::u32string codePoints(std::string_view utf8) {
    std::u32string out;
    out.reserve(utf8.size());
    for (std::size_t at = 0; at < utf8.size();) {
        const std::uint8_t first = byteAt(utf8, at);
        const auto* lead = std::find_if(kLeads.begin(), kLeads.end(),
                                        [&](const Lead& l) { return (first & l.mask) == l.pattern; });
        const auto value = lead == kLeads.end() ? std::nullopt : sequence(utf8, at, *lead);
        out.push_back(value.value_or(first));
        at += value ? std::size_t{lead->following} + 1 : 1;
    }
    return out;
}

std::u16string utf16(std::string_view utf8) {
    std::u16string out;
    for (char32_t point : codePoints(utf8)) {
        if (point < 0x10000) {
            out.push_back(static_cast<char16_t>(point));
            continue;
        }
        point -= 0x10000;
        out.push_back(static_cast<char16_t>(0xD800 + (point >> 10)));
        out.push_back(static_cast<char16_t>(0xDC00 + (point & 0x3FF)));
    }
    return out;
}

std::string latin1(std::string_view utf8) {
    std::string out;
    for (const char32_t point : codePoints(utf8))
        out.push_back(point <= 0xFF ? static_cast<char>(point) : '?');
    return out;
}

std::string utf8(std::u32string_view codePoints) {
    std::string out;
    out.reserve(codePoints.size());
    for (const char32_t point : codePoints)
        appendUtf8(out, isCodePoint(point) ? point : U'\uFFFD');
    return out;
}

std::string textOfBytes(std::span<const std::uint8_t> bytes) {
    return utf8(codePoints(std::string(bytes.begin(), bytes.end())));
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

bool equalsNoCase(std::string_view a, std::string_view b) {
    return std::equal(a.begin(), a.end(), b.begin(), b.end(),
                      [](char x, char y) { return lower(x) == lower(y); });
}

bool startsWithNoCase(std::string_view text, std::string_view prefix) {
    return text.size() >= prefix.size() && equalsNoCase(text.substr(0, prefix.size()), prefix);
}

}  // namespace vexa::simulation
