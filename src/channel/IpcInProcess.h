#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

namespace vexa {

/// A client of the channels of protocol/Ipc.h where they are kept in the process instead of on sockets: for
/// engine tests, which own all threads.
class InProcessClient {
public:
    struct State;

    /// Null if nothing serves this port.
    static std::unique_ptr<InProcessClient> connect(std::int32_t port);
    /// For connect().
    explicit InProcessClient(std::shared_ptr<State> state);
    ~InProcessClient();
    InProcessClient(const InProcessClient&) = delete;
    InProcessClient& operator=(const InProcessClient&) = delete;

    void send(const std::string& message);

    /// What has come since the last call, oldest first.
    std::vector<std::string> receive();

private:
    std::shared_ptr<State> m_state;
};

}  // namespace vexa
