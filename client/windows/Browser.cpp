#include "client/machine/Browser.h"

#include <windows.h>
// Behind the header that it needs.
#include <shellapi.h>

#include "text/TextConversion.h"

namespace vexa::client {

bool openInBrowser(const std::string& url) {
    constexpr INT_PTR kLastError = 32;
    const auto result =
        ShellExecuteW(nullptr, L"open", wideFromUtf8(url).c_str(), nullptr, nullptr, SW_SHOWNORMAL);
    return reinterpret_cast<INT_PTR>(result) > kLastError;
}

}  // namespace vexa::client
