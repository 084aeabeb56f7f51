#pragma once

#include <boost/asio/ip/tcp.hpp>
#include <span>
#include <string_view>
#include <vector>

namespace vexa {

// Who gets in at a server's port.

/// Whether the `Host` of a request names this machine's loopback.
bool isLoopbackHost(std::string_view host);

/// Of each connection, whether the process at its other end runs under our account.
std::vector<bool> areOfOurAccount(std::span<const boost::asio::ip::tcp::socket> connections);
bool isOfOurAccount(const boost::asio::ip::tcp::socket& connection);

}  // namespace vexa
