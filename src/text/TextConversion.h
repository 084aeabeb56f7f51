#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace vexa {

// Wide text holds what the platform's wchar_t holds: UTF-16 where it has 2 bytes, code points where it has 4.

/// UTF-8 in both directions. What is no valid sequence becomes U+FFFD, one for each byte, or for a lone
/// surrogate.
std::string utf8FromWide(std::wstring_view text);
std::wstring wideFromUtf8(std::string_view text);

std::string utf8FromUtf16(std::u16string_view text);
std::u16string utf16FromWide(std::wstring_view text);

/// At most `units` 16-bit units of the text, never half a surrogate pair.
std::wstring cutToUtf16Units(std::wstring_view text, std::size_t units);

/// Cuts each 16-bit unit to its low byte.
std::string narrowFromWide(std::wstring_view text);

/// Widens each byte, whatever its encoding: so a profile name is the SSID's bytes one for one.
std::wstring wideFromNarrow(std::string_view text);

/// The `wcstombs` rules of the platform's C locale: a unit up to 0xFF gives one byte. The result ends before
/// the first unit that has none; `isComplete` tells whether there was one.
struct NarrowText {
    std::string text;
    bool isComplete;
};
NarrowText narrowByLocale(std::wstring_view text);

/// The `_wtoi` rules: leading white space, a sign, decimal digits up to the first other character; 0 if there
/// are none, the limit where the value passes it.
std::int32_t leadingInteger(std::wstring_view text);

/// Three-way comparison with ASCII letters folded; a prefix comes before what it begins.
int compareNoCase(std::string_view a, std::string_view b);
int compareNoCase(std::wstring_view a, std::wstring_view b);

}  // namespace vexa
