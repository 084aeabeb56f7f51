#include "platform/PeerAccount.h"

#include <winsock2.h>
// After <winsock2.h>.
#include <iphlpapi.h>

#include <algorithm>
#include <optional>
#include <span>
#include <vector>

#include "platform/windows/ProcessUser.h"

namespace vexa::platform {

namespace {

// The table may grow between the question for its size and the one for its rows.
constexpr int kTableTries = 5;
constexpr DWORD kSpareRows = 64;
// While other connections come and go, a table can lack a row that is there, or its owner.
constexpr int kLooks = 3;

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

/// The process that has the peer's end of an established connection. Rows of other states can be left over
/// from a process that has ended, and its number can be another one's by now.
std::optional<DWORD> ownerIn(const Storage& storage, const PeerPorts& connection) {
    const auto& table = *reinterpret_cast<const MIB_TCPTABLE_OWNER_PID*>(storage.data());
    const std::span rows(table.table, table.dwNumEntries);
    const DWORD loopback = htonl(INADDR_LOOPBACK);
    const auto found = std::find_if(rows.begin(), rows.end(), [&](const MIB_TCPROW_OWNER_PID& row) {
        return row.dwState == MIB_TCP_STATE_ESTAB && row.dwLocalAddr == loopback &&
               row.dwRemoteAddr == loopback &&
               ntohs(static_cast<u_short>(row.dwLocalPort)) == connection.peer &&
               ntohs(static_cast<u_short>(row.dwRemotePort)) == connection.server;
    });
    return found != rows.end() ? std::optional(found->dwOwningPid) : std::nullopt;
}

// A process that has ended can still be opened as long as somebody else has it open.
bool isRunning(HANDLE process) {
    DWORD exitCode = 0;
    return GetExitCodeProcess(process, &exitCode) != 0 && exitCode == STILL_ACTIVE;
}

/// Nothing if there is no such process, or it doesn't tell.
std::optional<bool> isOfUser(DWORD processId, const Storage& user) {
    const Handle process(OpenProcess(PROCESS_QUERY_LIMITED_INFORMATION, FALSE, processId));
    if (!process || !isRunning(process.get())) return std::nullopt;
    const Storage other = userOf(process.get());
    return other.empty() ? std::nullopt : std::optional(EqualSid(sidOf(other), sidOf(user)) != 0);
}

/// Looks at those that are open; whether some are still.
bool answerFrom(const Storage& table, std::span<const PeerPorts> connections, const Storage& own,
                std::vector<std::optional<bool>>& answers) {
    for (std::size_t i = 0; i < connections.size(); ++i) {
        if (answers[i]) continue;
        if (const auto owner = ownerIn(table, connections[i])) answers[i] = isOfUser(*owner, own);
    }
    return std::find(answers.begin(), answers.end(), std::nullopt) != answers.end();
}

}  // namespace

std::vector<bool> arePeersOfSameAccount(std::span<const PeerPorts> connections) {
    std::vector<std::optional<bool>> answers(connections.size());
    const Storage own = userOf(GetCurrentProcess());
    bool isOpen = !own.empty();
    for (int i = 0; isOpen && i < kLooks; ++i) {
        Storage table;
        isOpen = !readTable(table) || answerFrom(table, connections, own, answers);
    }
    std::vector<bool> known(answers.size());
    std::transform(answers.begin(), answers.end(), known.begin(),
                   [](const auto& answer) { return answer.value_or(false); });
    return known;
}

}  // namespace vexa::platform
