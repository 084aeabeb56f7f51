#include "text/Utf8.h"

#include <algorithm>

namespace vexa {

namespace {

constexpr char32_t kReplacement = 0xFFFD;

// How many bytes a sequence has that begins with this one; 0: none does.
std::size_t sequenceLength(unsigned char first) {
    if (first < 0x80) return 1;
    if (first >= 0xC2 && first < 0xE0) return 2;
    if (first >= 0xE0 && first < 0xF0) return 3;
    if (first >= 0xF0 && first < 0xF5) return 4;
    return 0;
}

bool isCodePointOfLength(char32_t c, std::size_t length) {
    constexpr char32_t kLeast[] = {0, 0, 0x80, 0x800, 0x10000};
    return c >= kLeast[length] && c <= 0x10FFFF && !isHighSurrogate(c) && !isLowSurrogate(c);
}

}  // namespace

Utf8Character firstUtf8Character(std::string_view text) {
    const auto byteAt = [&](std::size_t i) { return static_cast<unsigned char>(text[i]); };
    const std::size_t length = sequenceLength(byteAt(0));
    if (length == 1) return {byteAt(0), 1};
    if (length == 0 || length > text.size()) return {kReplacement, 0};
    char32_t c = byteAt(0) & (0xFFU >> (length + 1));
    for (std::size_t i = 1; i < length; ++i) {
        if ((byteAt(i) & 0xC0) != 0x80) return {kReplacement, 0};
        c = c << 6 | (byteAt(i) & 0x3FU);
    }
    return isCodePointOfLength(c, length) ? Utf8Character{c, length} : Utf8Character{kReplacement, 0};
}

void appendUtf8(std::string& text, char32_t c) {
    if (c > 0x10FFFF || isHighSurrogate(c) || isLowSurrogate(c)) c = kReplacement;
    const auto byte = [&](char32_t bits) { text += static_cast<char>(static_cast<unsigned char>(bits)); };
    if (c < 0x80) return byte(c);
    if (c < 0x800) {
        byte(0xC0 | c >> 6);
    } else {
        if (c < 0x10000) {
            byte(0xE0 | c >> 12);
        } else {
            byte(0xF0 | c >> 18);
            byte(0x80 | (c >> 12 & 0x3F));
        }
        byte(0x80 | (c >> 6 & 0x3F));
    }
    byte(0x80 | (c & 0x3F));
}

bool isValidUtf8(std::string_view text) {
    while (!text.empty()) {
        const auto ascii = asciiLength(text);
        text.remove_prefix(ascii);
        if (text.empty()) break;
        const std::size_t length = firstUtf8Character(text).length;
        if (length == 0) return false;
        text.remove_prefix(length);
    }
    return true;
}

std::size_t asciiLength(std::string_view text) {
    const auto end = std::find_if(text.begin(), text.end(),
                                  [](char byte) { return static_cast<unsigned char>(byte) >= 0x80; });
    return static_cast<std::size_t>(end - text.begin());
}

bool isHighSurrogate(char32_t unit) {
    return unit >= 0xD800 && unit < 0xDC00;
}

bool isLowSurrogate(char32_t unit) {
    return unit >= 0xDC00 && unit < 0xE000;
}

}  // namespace vexa
