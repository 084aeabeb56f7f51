// Who the user is and whether he sits there, where the system's answers can't be chosen.

#include <windows.h>
// After <windows.h>.
#define SECURITY_WIN32
#include <security.h>
#include <wtsapi32.h>

#include <algorithm>

#include "simulation/windows/LoadedMachine.h"
#include "simulation/wlan/CallersMemory.h"
#include "text/TextConversion.h"

using vexa::simulation::loadedMachine;
using vexa::simulation::SessionState;

extern "C" {

BOOLEAN WINAPI userOfMachine(EXTENDED_NAME_FORMAT format, LPWSTR buffer, PULONG size) {
    const std::wstring name = vexa::wideFromUtf8(loadedMachine().scenario().user);
    const auto needed = static_cast<ULONG>(name.size() + 1);
    if (format != NameSamCompatible || name.empty()) {
        SetLastError(ERROR_NONE_MAPPED);
        return FALSE;
    }
    if (*size < needed) {
        *size = needed;
        SetLastError(ERROR_MORE_DATA);
        return FALSE;
    }
    std::copy_n(name.c_str(), needed, buffer);
    *size = needed - 1;
    return TRUE;
}

BOOL WINAPI sessionOfMachine(HANDLE /*server*/, DWORD /*session*/, WTS_INFO_CLASS what, LPWSTR* buffer,
                             DWORD* size) {
    if (what != WTSConnectState) {
        SetLastError(ERROR_NOT_SUPPORTED);
        return FALSE;
    }
    const bool isActive = loadedMachine().session() == SessionState::Active;
    const WTS_CONNECTSTATE_CLASS state = isActive ? WTSActive : WTSDisconnected;
    *buffer = static_cast<LPWSTR>(vexa::simulation::memoryForCaller(&state, sizeof state));
    *size = sizeof state;
    return TRUE;
}

void WINAPI freeSessionOfMachine(PVOID memory) {
    vexa::simulation::freeCallersMemory(memory);
}
}
