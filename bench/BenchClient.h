#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>
#include <string_view>

namespace vexa::bench {

/// A WebSocket client that blocks. Throws where a connection fails.
class BenchClient {
public:
    explicit BenchClient(std::uint16_t port);
    ~BenchClient();
    BenchClient(BenchClient&&) noexcept;

    void send(std::string_view message);
    /// Sends a message of less than 126 bytes so many times, in one write.
    void sendTogether(std::string_view message, std::size_t count);
    /// Waits for one message and gives its size.
    std::size_t receive();

private:
    struct Connection;
    std::unique_ptr<Connection> m_connection;
};

}  // namespace vexa::bench
