#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace vexa {

/// A character and how many bytes it takes; none: U+FFFD and length 0.
struct Utf8Character {
    char32_t codePoint;
    std::size_t length;
};

/// The character at the beginning of the text. Overlong forms, surrogates and numbers past the last code
/// point are no characters. REQUIRES: the text is not empty.
Utf8Character firstUtf8Character(std::string_view text);

/// U+FFFD in place of what is no character.
void appendUtf8(std::string& text, char32_t codePoint);

bool isValidUtf8(std::string_view text);

/// How many ASCII characters the text begins with: what most texts are made of can be taken in one go.
std::size_t asciiLength(std::string_view text);

bool isHighSurrogate(char32_t unit);
bool isLowSurrogate(char32_t unit);

/// One unit, or the two of a surrogate pair.
template <class Char>
void appendUtf16(std::basic_string<Char>& text, char32_t codePoint) {
    if (codePoint < 0x10000) {
        text += static_cast<Char>(codePoint);
    } else {
        text += static_cast<Char>(0xD800 + ((codePoint - 0x10000) >> 10));
        text += static_cast<Char>(0xDC00 + ((codePoint - 0x10000) & 0x3FF));
    }
}

}  // namespace vexa
