#include "client/machine/TcpEndpoints.h"

#include "client/terminal/ClientError.h"
#include "platform/posix/ProcNetTcp.h"

namespace vexa::client {

namespace {

constexpr const char* kTable = "/proc/net/tcp";
constexpr std::uint32_t kListening = 10;

std::vector<TcpEndpoint> read(posix::TcpSockets which) {
    std::vector<posix::TcpSocket> sockets;
    if (!posix::readProcNetTcp(kTable, sockets, which))
        throw ClientError(std::string("the TCP table cannot be read: ") + kTable);
    std::vector<TcpEndpoint> endpoints;
    endpoints.reserve(sockets.size());
    for (const posix::TcpSocket& socket : sockets)
        endpoints.push_back({socket.localPort, socket.state == kListening, socket.inode});
    return endpoints;
}

}  // namespace

std::vector<TcpEndpoint> readTcpEndpoints() {
    return read(posix::TcpSockets::All);
}

std::vector<TcpEndpoint> readTcpListeners() {
    return read(posix::TcpSockets::Listening);
}

}  // namespace vexa::client
