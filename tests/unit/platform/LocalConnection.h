#pragma once

#include <cstdint>
#include <memory>

namespace vexa::test {

/// A TCP connection between two sockets of this process on 127.0.0.1, and the socket that accepted it, which
/// still listens.
class LocalConnection {
public:
    LocalConnection();
    ~LocalConnection();
    LocalConnection(const LocalConnection&) = delete;
    LocalConnection& operator=(const LocalConnection&) = delete;

    std::uint16_t serverPort() const;
    std::uint16_t clientPort() const;

private:
    struct State;
    std::unique_ptr<State> m_state;
};

}  // namespace vexa::test
