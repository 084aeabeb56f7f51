#pragma once

#include <cstdint>
#include <memory>
#include <string>

namespace vexa::bench {

/// A WebSocket server on a free port of 127.0.0.1 with one thread and no promises: what the library alone
/// costs. Every message goes back to whom it came from.
class BareEchoServer {
public:
    BareEchoServer();
    ~BareEchoServer();
    BareEchoServer(const BareEchoServer&) = delete;
    BareEchoServer& operator=(const BareEchoServer&) = delete;

    std::uint16_t port() const;

private:
    class Impl;
    const std::unique_ptr<Impl> m_impl;
};

/// Writes messages to clients that never speak: one thread, one loop over all of them.
class BareBroadcaster {
public:
    BareBroadcaster();
    ~BareBroadcaster();
    BareBroadcaster(const BareBroadcaster&) = delete;
    BareBroadcaster& operator=(const BareBroadcaster&) = delete;

    std::uint16_t port() const;

    /// Returns before the message is written.
    void sendToAll(std::string message);

private:
    class Impl;
    const std::unique_ptr<Impl> m_impl;
};

}  // namespace vexa::bench
