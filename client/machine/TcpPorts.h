#pragma once

#include <cstdint>
#include <set>
#include <utility>
#include <vector>

#include "client/machine/KernelName.h"
#include "client/machine/TcpEndpoints.h"

namespace vexa::client {

/// A port that other parents do not get while this exists. A server that may reuse addresses can listen on
/// it.
struct ReservedPort {
    std::uint16_t port;
    NameHolder holder;
};

/// A server can have this port of the loopback address. Leaves no trace behind.
bool canBind(std::uint16_t port);

/// The IPv4 TCP endpoints of this host at one moment. Nothing is connected to find out about a port: a trial
/// connection would stay behind in the table and make the port busy for the service.
class TcpPorts {
public:
    explicit TcpPorts(std::vector<TcpEndpoint> endpoints) : m_endpoints(std::move(endpoints)) {}

    /// Those of now. Throws ClientError if they can't be read.
    static TcpPorts read() { return TcpPorts(readTcpEndpoints()); }
    static TcpPorts readListeners() { return TcpPorts(readTcpListeners()); }

    /// Any endpoint, in whatever state.
    bool isBusy(std::uint16_t port) const;

    /// The owners of those that listen on the port.
    std::set<std::uint64_t> listeners(std::uint16_t port) const;

    /// Reserves a port without an endpoint. Throws ClientError if there is none.
    ReservedPort reserveFree() const;

private:
    std::vector<TcpEndpoint> m_endpoints;
};

}  // namespace vexa::client
