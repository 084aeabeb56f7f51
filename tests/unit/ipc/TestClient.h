#pragma once

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace vexa::test {

/// No wait of a test lasts longer; one that does is a failure.
inline constexpr std::chrono::seconds kPatience{20};

/// A port on which nothing listens, and that nobody else takes while this process runs.
std::int32_t freePort();

/// A TCP connection that speaks as it likes.
class RawClient {
public:
    explicit RawClient(std::int32_t port);
    ~RawClient();
    RawClient(RawClient&&) noexcept;

    /// False once the other end has gone.
    bool send(std::string_view bytes);
    /// All that comes until the other end closes; what has come so far if that takes too long.
    std::string receiveToEnd();
    /// So many bytes; fewer if the connection ended before.
    std::string receive(std::size_t size);
    /// The answer to a request: all to its blank line.
    std::string receiveHead();
    /// The rest of the connection as it is: nothing more is sent.
    void endSending();

private:
    struct Connection;
    std::unique_ptr<Connection> m_connection;
};

/// The request of a handshake, with its blank line; `more` are header lines, each with its line end.
std::string handshakeRequest(const std::string& host, const std::string& more = {});

/// A WebSocket client that blocks, for as long as kPatience.
class TestClient {
public:
    explicit TestClient(std::int32_t port);
    ~TestClient();
    TestClient(TestClient&&) noexcept;

    void send(std::string_view message);
    /// The next message; nothing if the connection ended instead.
    std::optional<std::string> receive();
    /// The code with which the server closed; 0 if the connection just ended.
    std::uint16_t closeCode() const;

private:
    struct Connection;
    std::unique_ptr<Connection> m_connection;
};

}  // namespace vexa::test
