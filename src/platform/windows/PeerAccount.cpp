#include "platform/PeerAccount.h"

#include <winsock2.h>
// After <winsock2.h>.
#include <iphlpapi.h>

#include <algorithm>
#include <cstddef>
#include <optional>
#include <span>
#include <vector>

#include "platform/windows/Handle.h"

namespace vexa::platform {

namespace {

// The table may grow between the question for its size and the one for its rows.
constexpr int kTableTries = 5;
constexpr DWORD kSpareRows = 64;

/// Memory for a structure whose size only the operating system knows.
using Storage = std::vector<std::max_align_t>;

void makeRoom(Storage& storage, DWORD size) {
    storage.resize(size / sizeof(std::max_align_t) + 1);
}

bool readTable(Storage& table) {
    DWORD size = 0;
    for (int i = 0; i < kTableTries; ++i) {
        makeRoom(table, size);
        const DWORD result =
            GetExtendedTcpTable(table.data(), &size, FALSE, AF_INET, TCP_TABLE_OWNER_PID_ALL, 0);
        if (result != ERROR_INSUFFICIENT_BUFFER) return result == NO_ERROR;
        size += kSpareRows * static_cast<DWORD>(sizeof(MIB_TCPROW_OWNER_PID));
    }
    return false;
}

/// The process that has the end of a connection with these ports of 127.0.0.1.
std::optional<DWORD> ownerOf(std::uint16_t localPort, std::uint16_t remotePort) {
    Storage storage;
    if (!readTable(storage)) return std::nullopt;
    const auto& table = *reinterpret_cast<const MIB_TCPTABLE_OWNER_PID*>(storage.data());
    const std::span rows(table.table, table.dwNumEntries);
    const DWORD loopback = htonl(INADDR_LOOPBACK);
    const auto found = std::find_if(rows.begin(), rows.end(), [&](const MIB_TCPROW_OWNER_PID& row) {
        return row.dwLocalAddr == loopback && row.dwRemoteAddr == loopback &&
               ntohs(static_cast<u_short>(row.dwLocalPort)) == localPort &&
               ntohs(static_cast<u_short>(row.dwRemotePort)) == remotePort;
    });
    return found != rows.end() ? std::optional(found->dwOwningPid) : std::nullopt;
}

/// The user of a process: a TOKEN_USER; empty if it can't be told.
Storage userOf(HANDLE process) {
    Handle token;
    if (OpenProcessToken(process, TOKEN_QUERY, token.receive()) == 0) return {};
    DWORD size = 0;
    GetTokenInformation(token.get(), TokenUser, nullptr, 0, &size);
    Storage user;
    makeRoom(user, size);
    if (GetTokenInformation(token.get(), TokenUser, user.data(), size, &size) == 0) return {};
    return user;
}

PSID sidOf(const Storage& user) {
    return reinterpret_cast<const TOKEN_USER*>(user.data())->User.Sid;
}

}  // namespace

bool isPeerOfSameAccount(std::uint16_t peerPort, std::uint16_t serverPort) {
    const auto owner = ownerOf(peerPort, serverPort);
    if (!owner) return false;
    const Handle process(OpenProcess(PROCESS_QUERY_LIMITED_INFORMATION, FALSE, *owner));
    if (!process) return false;
    const Storage peer = userOf(process.get());
    const Storage own = userOf(GetCurrentProcess());
    return !peer.empty() && !own.empty() && EqualSid(sidOf(peer), sidOf(own)) != 0;
}

}  // namespace vexa::platform
