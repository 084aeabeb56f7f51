// The service as a process of Windows: without a window and without a console.

#include <string>

#include "platform/WlanApi.h"  // With it the types of an entry.
#include "service/Service.h"

int WINAPI wWinMain(HINSTANCE /*instance*/, HINSTANCE /*previous*/, PWSTR arguments, int /*show*/) {
    const std::wstring line = arguments != nullptr ? arguments : L"";
    if (vexa::tellVersion(line)) return 0;
    return vexa::runService(&line);
}
