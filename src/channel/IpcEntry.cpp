#include "channel/IpcEntry.h"

#include <algorithm>
#include <boost/asio/ip/address_v4.hpp>
#include <boost/asio/ip/address_v6.hpp>
#include <boost/beast/core/string.hpp>
#include <cstddef>
#include <string>

#include "platform/PeerAccount.h"

namespace vexa {

namespace {

namespace asio = boost::asio;
using asio::ip::tcp;
using boost::system::error_code;

bool isPortOrNothing(std::string_view text) {
    if (text.empty()) return true;
    return text.front() == ':' &&
           std::all_of(text.begin() + 1, text.end(), [](char c) { return c >= '0' && c <= '9'; });
}

// Ports that no connection has where it has just ended.
platform::PeerPorts portsOf(const tcp::socket& connection) {
    error_code ec;
    const tcp::endpoint peer = connection.remote_endpoint(ec);
    const tcp::endpoint local = ec ? tcp::endpoint() : connection.local_endpoint(ec);
    return ec ? platform::PeerPorts{} : platform::PeerPorts{peer.port(), local.port()};
}

}  // namespace

// A name that merely begins like this machine's may lead anywhere: nothing but a port stands behind it.
bool isLoopbackHost(std::string_view host) {
    error_code ec;
    if (!host.empty() && host.front() == '[') {
        const std::size_t end = host.find(']');
        if (end == std::string_view::npos || !isPortOrNothing(host.substr(end + 1))) return false;
        const auto address = asio::ip::make_address_v6(std::string(host.substr(1, end - 1)), ec);
        return !ec && address.is_loopback();
    }
    const std::size_t end = std::min(host.find(':'), host.size());
    if (!isPortOrNothing(host.substr(end))) return false;
    const std::string name(host.substr(0, end));
    if (boost::beast::iequals(name, "localhost")) return true;
    const auto address = asio::ip::make_address_v4(name, ec);
    return !ec && address.is_loopback();
}

std::vector<bool> areOfOurAccount(std::span<const tcp::socket> connections) {
    std::vector<platform::PeerPorts> ports;
    for (const tcp::socket& connection : connections)
        ports.push_back(portsOf(connection));
    return platform::arePeersOfSameAccount(ports);
}

bool isOfOurAccount(const tcp::socket& connection) {
    return areOfOurAccount(std::span(&connection, 1)).front();
}

}  // namespace vexa
