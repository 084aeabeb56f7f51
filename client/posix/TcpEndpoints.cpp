#include "client/machine/TcpEndpoints.h"

#include "client/terminal/ClientError.h"
#include "platform/posix/ProcNetTcp.h"

namespace vexa::client {

namespace {

constexpr const char* kTable = "/proc/net/tcp";
constexpr std::uint32_t kListening = 10;

}  // namespace

std::vector<TcpEndpoint> readTcpEndpoints() {
    std::vector<posix::TcpSocket> sockets;
    if (!posix::readProcNetTcp(kTable, sockets))
        throw ClientError(std::string("the TCP table cannot be read: ") + kTable);
    std::vector<TcpEndpoint> endpoints;
    endpoints.reserve(sockets.size());
    for (const posix::TcpSocket& socket : sockets)
        endpoints.push_back({socket.localPort, socket.state == kListening, socket.inode});
    return endpoints;
}

}  // namespace vexa::client
