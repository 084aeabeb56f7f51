#include "platform/Account.h"

#include <windows.h>
// After <windows.h>.
#define SECURITY_WIN32
#include <security.h>

#include <array>

namespace vexa::platform {

namespace {

constexpr ULONG kNameCapacity = 257;

}  // namespace

std::optional<std::wstring> accountName() {
    std::array<wchar_t, kNameCapacity> name{};
    ULONG length = kNameCapacity;
    if (GetUserNameExW(NameSamCompatible, name.data(), &length) == 0) return std::nullopt;
    return name.data();
}

}  // namespace vexa::platform
