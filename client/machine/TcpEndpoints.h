#pragma once

#include <cstdint>
#include <string>
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

/// The endpoints in a table as a Linux kernel writes it. Throws ClientError if it can't be read.
std::vector<TcpEndpoint> readTcpTable(const std::string& file);

/// A server can have this port of 127.0.0.1. Leaves no trace behind.
bool canBind(std::uint16_t port);

}  // namespace vexa::client
