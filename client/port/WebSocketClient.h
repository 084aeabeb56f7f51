#pragma once

#include <chrono>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>

#include "client/terminal/Poll.h"

namespace vexa::client {

/// A client of one port of the service. One thread uses it: it waits for polled(), lets process() do what is
/// due, and takes the messages.
class WebSocketClient {
public:
    /// Connects. Throws ClientError if nobody answers there, or if he lets nobody in.
    explicit WebSocketClient(std::uint16_t port);

    /// Leaves with a close frame, after what was queued has been sent.
    ~WebSocketClient();
    WebSocketClient(const WebSocketClient&) = delete;
    WebSocketClient& operator=(const WebSocketClient&) = delete;

    /// What has to be waited for until process() has something to do.
    Polled polled() const;

    /// Sends and receives what can be without waiting.
    void process();

    /// Queues a text message.
    void send(std::string text);

    /// The oldest message not yet taken.
    std::optional<std::string> take();

    /// Throws NoAnswer once the connection is lost.
    void requireOpen() const;

    /// Sends what is queued and says goodbye; waits for the answer up to `limit`.
    void close(std::chrono::milliseconds limit);

private:
    class Impl;
    std::unique_ptr<Impl> m_impl;
};

}  // namespace vexa::client
