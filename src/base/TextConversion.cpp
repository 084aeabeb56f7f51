#include "base/TextConversion.h"

#include <algorithm>
#include <limits>

namespace vexa {

namespace {

constexpr std::wstring_view kWhiteSpace = L" \t\n\v\f\r";

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

std::string narrowFromWide(std::wstring_view text) {
    std::string narrow(text.size(), '\0');
    std::transform(text.begin(), text.end(), narrow.begin(), [](wchar_t unit) {
        return static_cast<char>(static_cast<unsigned char>(static_cast<std::uint32_t>(unit) & 0xFF));
    });
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
    const auto length = static_cast<std::size_t>(end - text.begin());
    return {narrowFromWide(text.substr(0, length)), length == text.size()};
}

std::int32_t leadingInteger(std::wstring_view text) {
    using Limits = std::numeric_limits<std::int32_t>;
    text.remove_prefix(std::min(text.find_first_not_of(kWhiteSpace), text.size()));
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
