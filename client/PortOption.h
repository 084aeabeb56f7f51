#pragma once

#include <cstdint>
#include <string>

namespace CLI {
class App;
}

namespace vexa::client {

/// How a command finds the spectral port of a running service.
struct PortOption {
    std::uint16_t port = 0;
    std::string machine;

    void addTo(CLI::App& command);

    /// The port that was given; else that of the environment; else what the parent left in the machine's
    /// folder. Throws ClientError if none tells.
    std::uint16_t spectralPort() const;
};

}  // namespace vexa::client
