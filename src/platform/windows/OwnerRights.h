#pragma once

#include <windows.h>

#include <sddl.h>

#include <string>

#include "platform/windows/Handle.h"
#include "platform/windows/ProcessUser.h"

namespace vexa::platform {

using SecurityDescriptor = Owned<PSECURITY_DESCRIPTOR, &::LocalFree>;

/// All rights for the system, the administrators and the user of this process, those besides for `others`,
/// and nothing inherited. Empty if the user can't be told.
inline SecurityDescriptor rightsOf(const wchar_t* others) {
    SecurityDescriptor descriptor;
    const Storage user = userOf(GetCurrentProcess());
    Owned<LPWSTR, &::LocalFree> sid;
    if (user.empty() || ConvertSidToStringSidW(sidOf(user), sid.receive()) == 0) return descriptor;
    const std::wstring rights =
        L"D:P(A;;FA;;;SY)(A;;FA;;;BA)(A;;FA;;;" + std::wstring(sid.get()) + L")" + others;
    ConvertStringSecurityDescriptorToSecurityDescriptorW(rights.c_str(), SDDL_REVISION_1,
                                                         descriptor.receive(), nullptr);
    return descriptor;
}

}  // namespace vexa::platform
