#include "client/machine/TcpEndpoints.h"

#include <arpa/inet.h>
#include <sys/socket.h>

#include <fstream>
#include <sstream>
#include <string_view>

#include "client/posix/Descriptor.h"
#include "client/terminal/ClientError.h"

namespace vexa::client {

namespace {

constexpr std::string_view kListening = "0A";

}  // namespace

std::vector<TcpEndpoint> readTcpTable(const std::string& file) {
    std::ifstream table(file);
    std::string line;
    if (!std::getline(table, line)) throw ClientError("the TCP table cannot be read: " + file);
    std::vector<TcpEndpoint> endpoints;
    while (std::getline(table, line)) {
        std::istringstream fields(line);
        std::string slot, local, remote, state, queues, timer, retransmits, user, timeout;
        std::uint64_t socket = 0;
        fields >> slot >> local >> remote >> state >> queues >> timer >> retransmits >> user >> timeout >>
            socket;
        const auto colon = local.find(':');
        if (!fields || colon == std::string::npos) continue;
        const auto port = static_cast<std::uint16_t>(std::stoul(local.substr(colon + 1), nullptr, 16));
        endpoints.push_back({port, state == kListening, socket});
    }
    return endpoints;
}

std::vector<TcpEndpoint> readTcpEndpoints() {
    return readTcpTable("/proc/net/tcp");
}

bool canBind(std::uint16_t port) {
    const Descriptor socket(::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0));
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_port = htons(port);
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    return ::bind(socket.get(), reinterpret_cast<const sockaddr*>(&address), sizeof address) == 0;
}

}  // namespace vexa::client
