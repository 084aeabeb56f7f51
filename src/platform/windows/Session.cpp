#include "platform/Session.h"

#include <windows.h>
#include <wtsapi32.h>

#include <cstring>

#include "platform/windows/Handle.h"

namespace vexa::platform {

bool isSessionActive() {
    DWORD session = 0;
    if (ProcessIdToSessionId(GetCurrentProcessId(), &session) == 0) return false;
    Owned<LPWSTR, &WTSFreeMemory> answer;
    DWORD size = 0;
    if (WTSQuerySessionInformationW(WTS_CURRENT_SERVER_HANDLE, session, WTSConnectState, answer.receive(),
                                    &size) == 0)
        return false;
    WTS_CONNECTSTATE_CLASS state{};
    if (size != sizeof state || !answer) return false;
    std::memcpy(&state, answer.get(), sizeof state);
    return state == WTSActive;
}

}  // namespace vexa::platform
