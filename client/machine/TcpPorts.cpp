#include "client/machine/TcpPorts.h"

#include <algorithm>
#include <boost/asio/io_context.hpp>
#include <boost/asio/ip/tcp.hpp>
#include <random>
#include <string>

#include "client/terminal/ClientError.h"

namespace vexa::client {

namespace {

namespace asio = boost::asio;
using asio::ip::tcp;

// Below the range from which the operating system takes ports for outgoing connections: one of those, on the
// port between our choice and the start of the service, would make it busy.
constexpr int kFirstPort = 10000;
constexpr int kLastPort = 32000;
constexpr int kAttempts = 2000;

}  // namespace

bool canBind(std::uint16_t port) {
    asio::io_context context;
    tcp::socket socket(context, tcp::v4());
    boost::system::error_code error;
    socket.bind({asio::ip::address_v4::loopback(), port}, error);
    return !error;
}

bool TcpPorts::isBusy(std::uint16_t port) const {
    return std::any_of(m_endpoints.begin(), m_endpoints.end(),
                       [port](const TcpEndpoint& endpoint) { return endpoint.port == port; });
}

std::set<std::uint64_t> TcpPorts::listeners(std::uint16_t port) const {
    std::set<std::uint64_t> owners;
    for (const TcpEndpoint& endpoint : m_endpoints) {
        if (endpoint.port == port && endpoint.listens) owners.insert(endpoint.owner);
    }
    return owners;
}

ReservedPort TcpPorts::reserveFree() const {
    std::random_device random;
    std::uniform_int_distribution<int> anyPort(kFirstPort, kLastPort);
    for (int attempt = 0; attempt < kAttempts; ++attempt) {
        const auto port = static_cast<std::uint16_t>(anyPort(random));
        if (isBusy(port)) continue;
        NameHolder holder = takeKernelName("vexa-port-" + std::to_string(port));
        if (holder && canBind(port)) return {port, std::move(holder)};
    }
    throw ClientError("no free TCP port was found", kExitNotStarted);
}

}  // namespace vexa::client
