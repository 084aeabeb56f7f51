// The library that takes the place of the system's WLAN service: only in Wine, for it writes into the
// registry what no real machine should find there.

#include <windows.h>

#include "simulation/windows/LoadedMachine.h"

namespace {

bool isWine() {
    return GetProcAddress(GetModuleHandleW(L"ntdll.dll"), "wine_get_version") != nullptr;
}

}  // namespace

extern "C" {

BOOL WINAPI DllMain(HINSTANCE /*library*/, DWORD reason, LPVOID /*reserved*/) {
    if (reason != DLL_PROCESS_ATTACH) return TRUE;
    if (!isWine()) return FALSE;
    vexa::simulation::prepareSystem();
    return TRUE;
}

DWORD WINAPI openHandleOnMachine(DWORD version, PVOID reserved, PDWORD negotiated, PHANDLE handle) {
    vexa::simulation::loadedMachine();
    return WlanOpenHandle(version, reserved, negotiated, handle);
}
}
