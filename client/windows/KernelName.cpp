#include "client/machine/KernelName.h"

#include <windows.h>

#include "platform/windows/Handle.h"
#include "text/TextConversion.h"

namespace vexa::client {

// A mutex that nobody locks. Another user's can't be opened, and is taken as well.
NameHolder takeKernelName(const std::string& name) {
    const std::wstring global = wideFromUtf8("Global\\" + name);
    platform::Handle mutex(CreateMutexW(nullptr, FALSE, global.c_str()));
    if (!mutex || GetLastError() == ERROR_ALREADY_EXISTS) return nullptr;
    return std::make_shared<platform::Handle>(std::move(mutex));
}

std::string accountTag() {
    DWORD session = 0;
    ProcessIdToSessionId(GetCurrentProcessId(), &session);
    return std::to_string(session);
}

}  // namespace vexa::client
