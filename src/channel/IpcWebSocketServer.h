#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <string_view>

#include "channel/IpcLimits.h"

namespace vexa {

/// A WebSocket server (RFC 6455) on one port of 127.0.0.1. One WebSocket message is one message: text or
/// binary comes in, text goes out. Only processes of this account get in, with a loopback name in `Host` and
/// without an `Origin`; everyone else gets HTTP 403, or a reset in a crowd.
///
/// One thread runs the input and output of all clients and the handler, so that an answer need not wait for
/// another thread to wake up. What a handler queues for sending waits for that of the messages behind it, for
/// a millisecond at most, and is written with it; what others queue, between two messages that are handled.
/// While a handler is slow, a second thread runs the input and output: it takes over within some 2 ms. So
/// neither a slow handler nor a run of quick ones holds up the writing of queued messages or the reading of
/// others.
class IpcWebSocketServer {
public:
    using ClientId = std::uint64_t;

    /// Called with one message at a time, in order of arrival over all clients. The text is valid during the
    /// call.
    using Handler = std::function<void(ClientId client, std::string_view message)>;

    static constexpr std::size_t kMaxMessage = kMaxIpcMessage;
    static constexpr std::size_t kMaxQueued = kMaxIpcQueued;

    class Impl;

    /// Null if `port` is not a free port from 1 to 65535. Serves at once.
    static std::shared_ptr<IpcWebSocketServer> create(std::int32_t port, Handler handler);

    /// For create().
    explicit IpcWebSocketServer(std::unique_ptr<Impl> impl);

    /// Stops.
    ~IpcWebSocketServer();
    IpcWebSocketServer(const IpcWebSocketServer&) = delete;
    IpcWebSocketServer& operator=(const IpcWebSocketServer&) = delete;

    /// Queues a message for every client. Never blocks; any thread. False if there is no client to take it. A
    /// client with several messages of more than kMaxQueued bytes waiting behind the one that goes out is
    /// dropped with close code 1008.
    bool sendToAll(std::string_view message);

    /// Queues a message for one client, dropped if he has left.
    void sendTo(ClientId client, std::string_view message);

    /// Whether any client is in. Any thread.
    bool hasClients() const;

    /// Sends what is queued, for half a second at most, and drops all clients with close code 1001. Returns
    /// after the last call of the handler has; sends give false from now on. REQUIRES: not called by the
    /// handler, and no lock held that it takes.
    void stop();

private:
    const std::unique_ptr<Impl> m_impl;
};

}  // namespace vexa
