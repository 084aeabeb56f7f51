#include "platform/CodePage.h"

#include <windows.h>

namespace vexa::platform {

std::string inCodePage(std::wstring_view text) {
    const auto length = static_cast<int>(text.size());
    const auto convert = [&](char* narrow, int size) {
        return WideCharToMultiByte(CP_ACP, 0, text.data(), length, narrow, size, nullptr, nullptr);
    };
    std::string narrow(static_cast<std::size_t>(convert(nullptr, 0)), '\0');
    convert(narrow.data(), static_cast<int>(narrow.size()));
    return narrow;
}

}  // namespace vexa::platform
