#include "client/TcpPorts.h"

#include <arpa/inet.h>
#include <sys/socket.h>

#include <algorithm>
#include <fstream>
#include <random>
#include <sstream>

#include "client/ClientError.h"
#include "client/Descriptor.h"
#include "client/KernelName.h"

namespace vexa::client {

namespace {

constexpr std::string_view kListening = "0A";

// Below the range from which the operating system takes ports for outgoing connections: one of those, on the
// port between our choice and the start of the service, would make it busy.
constexpr int kFirstPort = 10000;
constexpr int kLastPort = 32000;
constexpr int kAttempts = 2000;

bool canBind(std::uint16_t port) {
    const Descriptor socket(::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0));
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_port = htons(port);
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    return ::bind(socket.get(), reinterpret_cast<const sockaddr*>(&address), sizeof address) == 0;
}

}  // namespace

TcpPorts TcpPorts::read(const std::string& table) {
    std::ifstream file(table);
    std::string line;
    if (!std::getline(file, line)) throw ClientError("the TCP table cannot be read: " + table);
    TcpPorts ports;
    while (std::getline(file, line)) {
        std::istringstream fields(line);
        std::string slot, local, remote, state, queues, timer, retransmits, user, timeout;
        std::uint64_t socket = 0;
        fields >> slot >> local >> remote >> state >> queues >> timer >> retransmits >> user >> timeout >>
            socket;
        const auto colon = local.find(':');
        if (!fields || colon == std::string::npos) continue;
        const auto port = static_cast<std::uint16_t>(std::stoul(local.substr(colon + 1), nullptr, 16));
        ports.m_rows.push_back({port, state == kListening, socket});
    }
    return ports;
}

bool TcpPorts::isBusy(std::uint16_t port) const {
    return std::any_of(m_rows.begin(), m_rows.end(), [port](const Row& row) { return row.port == port; });
}

std::set<std::uint64_t> TcpPorts::listeners(std::uint16_t port) const {
    std::set<std::uint64_t> sockets;
    for (const Row& row : m_rows) {
        if (row.port == port && row.listens) sockets.insert(row.socket);
    }
    return sockets;
}

ReservedPort TcpPorts::reserveFree() const {
    std::random_device random;
    std::uniform_int_distribution<int> anyPort(kFirstPort, kLastPort);
    for (int attempt = 0; attempt < kAttempts; ++attempt) {
        const auto port = static_cast<std::uint16_t>(anyPort(random));
        if (isBusy(port)) continue;
        Descriptor holder = takeKernelName("vexa-port-" + std::to_string(port));
        if (holder && canBind(port)) return {port, std::move(holder)};
    }
    throw ClientError("no free TCP port was found", kExitNotStarted);
}

}  // namespace vexa::client
