#include "platform/PeerAccount.h"

#include <unistd.h>

#include <algorithm>

#include "platform/posix/ProcNetTcp.h"

namespace vexa::platform {

namespace {

struct Table {
    const char* path;
    const char* loopback;
};

// The second is for a peer that reaches 127.0.0.1 through an IPv6 socket.
constexpr Table kTables[] = {
    {"/proc/net/tcp", "0100007F"},
    {"/proc/net/tcp6", "0000000000000000FFFF00000100007F"},
};

}  // namespace

bool isPeerOfSameAccount(std::uint16_t peerPort, std::uint16_t serverPort) {
    const uid_t own = geteuid();
    for (const Table& table : kTables) {
        std::vector<posix::TcpSocket> rows;
        if (!posix::readProcNetTcp(table.path, rows)) continue;
        const auto peer = std::find_if(rows.begin(), rows.end(), [&](const posix::TcpSocket& row) {
            return row.localPort == peerPort && row.remotePort == serverPort &&
                   row.localAddress == table.loopback && row.remoteAddress == table.loopback;
        });
        if (peer != rows.end()) return peer->uid == own;
    }
    return false;
}

}  // namespace vexa::platform
