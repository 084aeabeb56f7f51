#pragma once

#include <windows.h>

#include <cstddef>
#include <vector>

#include "platform/windows/Handle.h"

namespace vexa::platform {

/// Memory for a structure whose size only the operating system knows.
using Storage = std::vector<std::max_align_t>;

inline void makeRoom(Storage& storage, DWORD size) {
    storage.resize(size / sizeof(std::max_align_t) + 1);
}

/// The user of a process: a TOKEN_USER; empty if it can't be told.
inline Storage userOf(HANDLE process) {
    Handle token;
    if (OpenProcessToken(process, TOKEN_QUERY, token.receive()) == 0) return {};
    DWORD size = 0;
    GetTokenInformation(token.get(), TokenUser, nullptr, 0, &size);
    Storage user;
    makeRoom(user, size);
    if (GetTokenInformation(token.get(), TokenUser, user.data(), size, &size) == 0) return {};
    return user;
}

inline PSID sidOf(const Storage& user) {
    return reinterpret_cast<const TOKEN_USER*>(user.data())->User.Sid;
}

}  // namespace vexa::platform
