#pragma once

#include <cstdint>
#include <span>
#include <vector>

namespace vexa::platform {

/// A TCP connection from a port of 127.0.0.1 to another, in host byte order.
struct PeerPorts {
    std::uint16_t peer = 0;
    std::uint16_t server = 0;
};

/// Of each connection, whether it is established and a process under the account of this one has the peer's
/// end of it. False also where it can't be told. Where the system knows only all connections at once, they
/// are looked at once for all.
std::vector<bool> arePeersOfSameAccount(std::span<const PeerPorts> connections);

}  // namespace vexa::platform
