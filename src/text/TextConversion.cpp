#include "text/TextConversion.h"

#include <algorithm>
#include <iterator>
#include <limits>
#include <type_traits>

#include "text/Utf8.h"

namespace vexa {

namespace {

constexpr std::wstring_view kBlanksBeforeNumbers = L" \t\n\v\f\r";

constexpr bool kIsUtf16 = sizeof(wchar_t) == 2;

char32_t unitAt(std::wstring_view text, std::size_t index) {
    return static_cast<std::make_unsigned_t<wchar_t>>(text[index]);
}

char32_t unitAt(std::u16string_view text, std::size_t index) {
    return text[index];
}

/// One character of wide text and how many wchar_t it takes.
struct WideCharacter {
    char32_t codePoint;
    std::size_t length;
};

template <class Char>
WideCharacter characterAt(std::basic_string_view<Char> text, std::size_t index) {
    const char32_t unit = unitAt(text, index);
    if (sizeof(Char) == 2 && isHighSurrogate(unit) && index + 1 < text.size()) {
        const char32_t low = unitAt(text, index + 1);
        if (isLowSurrogate(low)) return {0x10000 + ((unit - 0xD800) << 10) + (low - 0xDC00), 2};
    }
    return {unit, 1};
}

template <class Char>
std::string encodeUtf8(std::basic_string_view<Char> text) {
    std::string utf8;
    utf8.reserve(text.size());
    for (std::size_t i = 0; i < text.size();) {
        if (unitAt(text, i) < 0x80) {
            utf8 += static_cast<char>(text[i++]);
            continue;
        }
        const WideCharacter character = characterAt(text, i);
        appendUtf8(utf8, character.codePoint);
        i += character.length;
    }
    return utf8;
}

void appendWide(std::wstring& text, char32_t c) {
    if (kIsUtf16)
        appendUtf16(text, c);
    else
        text += static_cast<wchar_t>(c);
}

template <class Char>
Char foldCase(Char c) {
    return c >= 'A' && c <= 'Z' ? static_cast<Char>(c + ('a' - 'A')) : c;
}

template <class Char>
int compareFolded(std::basic_string_view<Char> a, std::basic_string_view<Char> b) {
    std::basic_string<Char> left(a);
    std::basic_string<Char> right(b);
    std::transform(left.begin(), left.end(), left.begin(), foldCase<Char>);
    std::transform(right.begin(), right.end(), right.begin(), foldCase<Char>);
    return left.compare(right);
}

}  // namespace

std::string utf8FromWide(std::wstring_view text) {
    return encodeUtf8(text);
}

std::string utf8FromUtf16(std::u16string_view text) {
    return encodeUtf8(text);
}

std::wstring wideFromUtf8(std::string_view text) {
    std::wstring wide;
    wide.reserve(text.size());
    while (!text.empty()) {
        const std::size_t ascii = asciiLength(text);
        wide.append(text.begin(), text.begin() + static_cast<std::ptrdiff_t>(ascii));
        text.remove_prefix(ascii);
        if (text.empty()) break;
        const Utf8Character character = firstUtf8Character(text);
        appendWide(wide, character.codePoint);
        text.remove_prefix(std::max<std::size_t>(character.length, 1));
    }
    return wide;
}

std::wstring cutToUtf16Units(std::wstring_view text, std::size_t units) {
    std::size_t end = 0;
    while (end < text.size()) {
        const WideCharacter character = characterAt(text, end);
        const std::size_t needed = character.codePoint >= 0x10000 ? 2 : 1;
        if (needed > units) break;
        units -= needed;
        end += character.length;
    }
    return std::wstring(text.substr(0, end));
}

std::u16string utf16FromWide(std::wstring_view text) {
    std::u16string units;
    units.reserve(text.size());
    for (std::size_t i = 0; i < text.size(); ++i)
        appendUtf16(units, unitAt(text, i));
    return units;
}

std::string narrowFromWide(std::wstring_view text) {
    const std::u16string units = utf16FromWide(text);
    std::string narrow(units.size(), '\0');
    std::transform(units.begin(), units.end(), narrow.begin(),
                   [](char16_t unit) { return static_cast<char>(static_cast<unsigned char>(unit & 0xFF)); });
    return narrow;
}

std::wstring wideFromNarrow(std::string_view text) {
    std::wstring wide(text.size(), L'\0');
    std::transform(text.begin(), text.end(), wide.begin(),
                   [](char byte) { return static_cast<wchar_t>(static_cast<unsigned char>(byte)); });
    return wide;
}

NarrowText narrowByLocale(std::wstring_view text) {
    const auto end = std::find_if(text.begin(), text.end(),
                                  [](wchar_t unit) { return static_cast<std::uint32_t>(unit) > 0xFF; });
    std::string narrow;
    narrow.reserve(text.size());
    std::transform(text.begin(), end, std::back_inserter(narrow),
                   [](wchar_t unit) { return static_cast<char>(unit); });
    return {std::move(narrow), end == text.end()};
}

std::int32_t leadingInteger(std::wstring_view text) {
    using Limits = std::numeric_limits<std::int32_t>;
    text.remove_prefix(std::min(text.find_first_not_of(kBlanksBeforeNumbers), text.size()));
    const bool isNegative = !text.empty() && text.front() == L'-';
    if (isNegative || (!text.empty() && text.front() == L'+')) text.remove_prefix(1);
    std::int64_t value = 0;
    for (const wchar_t unit : text) {
        if (unit < L'0' || unit > L'9') break;
        value = std::min<std::int64_t>(value * 10 + (unit - L'0'), std::int64_t{Limits::max()} + 1);
    }
    return static_cast<std::int32_t>(isNegative ? -value : std::min<std::int64_t>(value, Limits::max()));
}

int compareNoCase(std::string_view a, std::string_view b) {
    return compareFolded(a, b);
}

int compareNoCase(std::wstring_view a, std::wstring_view b) {
    return compareFolded(a, b);
}

}  // namespace vexa
