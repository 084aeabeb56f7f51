#pragma once

#include <cstdint>
#include <set>
#include <string>
#include <vector>

#include "client/Descriptor.h"

namespace vexa::client {

/// A port that other parents do not get while this exists. A server that may reuse addresses can listen on
/// it.
struct ReservedPort {
    std::uint16_t port;
    Descriptor holder;
};

/// The IPv4 TCP endpoints of this host at one moment. Nothing is connected to find out about a port: a trial
/// connection would stay behind in the table and make the port busy for the service.
class TcpPorts {
public:
    /// Throws ClientError if the table cannot be read.
    static TcpPorts read(const std::string& table = "/proc/net/tcp");

    /// Any row, in whatever state.
    bool isBusy(std::uint16_t port) const;

    /// The sockets that listen on the port.
    std::set<std::uint64_t> listeners(std::uint16_t port) const;

    /// Reserves a port without a row. Throws ClientError if there is none.
    ReservedPort reserveFree() const;

private:
    struct Row {
        std::uint16_t port;
        bool listens;
        std::uint64_t socket;
    };
    std::vector<Row> m_rows;
};

}  // namespace vexa::client
