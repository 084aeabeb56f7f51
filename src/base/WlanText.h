#pragma once

#include <string>
#include <string_view>

#include "platform/WlanApi.h"
#include "text/TextConversion.h"

namespace vexa {

/// Wide text in the 16-bit characters of the WLAN interface.
inline std::basic_string<WCHAR> toWlanText(std::wstring_view text) {
    const std::u16string units = utf16FromWide(text);
    return {units.begin(), units.end()};
}

/// The text of a field of the WLAN interface, up to its first NUL or its end.
inline std::wstring fromWlanText(std::basic_string_view<WCHAR> field) {
    field = field.substr(0, field.find(WCHAR{0}));
    return wideFromUtf8(utf8FromUtf16(std::u16string(field.begin(), field.end())));
}

}  // namespace vexa
