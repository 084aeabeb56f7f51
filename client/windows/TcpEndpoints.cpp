#include "client/machine/TcpEndpoints.h"

#include <winsock2.h>
// After <winsock2.h>.
#include <iphlpapi.h>

#include <cstddef>
#include <span>
#include <string>

#include "client/terminal/ClientError.h"

namespace vexa::client {

namespace {

std::vector<std::max_align_t> readTable(TCP_TABLE_CLASS which) {
    std::vector<std::max_align_t> table;
    DWORD size = 0;
    for (;;) {
        table.resize(size / sizeof(std::max_align_t) + 1);
        const DWORD result = GetExtendedTcpTable(table.data(), &size, FALSE, AF_INET, which, 0);
        if (result == NO_ERROR) return table;
        if (result != ERROR_INSUFFICIENT_BUFFER)
            throw ClientError("the TCP table cannot be read: error " + std::to_string(result));
    }
}

std::vector<TcpEndpoint> read(TCP_TABLE_CLASS which) {
    const auto storage = readTable(which);
    const auto& table = *reinterpret_cast<const MIB_TCPTABLE_OWNER_PID*>(storage.data());
    std::vector<TcpEndpoint> endpoints;
    for (const MIB_TCPROW_OWNER_PID& row : std::span(table.table, table.dwNumEntries))
        endpoints.push_back({ntohs(static_cast<u_short>(row.dwLocalPort)),
                             row.dwState == MIB_TCP_STATE_LISTEN, row.dwOwningPid});
    return endpoints;
}

}  // namespace

std::vector<TcpEndpoint> readTcpEndpoints() {
    return read(TCP_TABLE_OWNER_PID_ALL);
}

std::vector<TcpEndpoint> readTcpListeners() {
    return read(TCP_TABLE_OWNER_PID_LISTENER);
}

}  // namespace vexa::client
