#pragma once

#include <cstdint>
#include <vector>

namespace vexa::client {

/// One IPv4 TCP endpoint of this host.
struct TcpEndpoint {
    std::uint16_t port;
    bool listens;
    std::uint64_t owner;  ///< Tells apart who has it: two that listen on one port differ in it.
};

/// All of them at this moment. Throws ClientError if they can't be read.
std::vector<TcpEndpoint> readTcpEndpoints();

/// Those alone that listen, which is quick on a busy host, too.
std::vector<TcpEndpoint> readTcpListeners();

}  // namespace vexa::client
