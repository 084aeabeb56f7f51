#include "client/MachineRegistry.h"

#include <windows.h>

namespace vexa::client {

std::optional<int> readConnectionMethod(const MachineFolder& /*machine*/) {
    DWORD method = 0;
    DWORD size = sizeof method;
    if (RegGetValueW(HKEY_CURRENT_USER, L"Software\\Korvane\\Vexa", L"EapMethod", RRF_RT_REG_DWORD, nullptr,
                     &method, &size) != ERROR_SUCCESS)
        return std::nullopt;
    return static_cast<int>(method);
}

}  // namespace vexa::client
