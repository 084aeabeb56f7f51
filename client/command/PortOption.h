#pragma once

#include <cstdint>
#include <optional>
#include <string>

#include "client/machine/MachineFolder.h"

namespace CLI {
class App;
}

namespace vexa::client {

/// The two halves of the service, each with a port of its own.
enum class Half { Spectral, Hotspot };

/// How a command finds a port of a running service.
class PortOption {
public:
    explicit PortOption(Half half) : m_half(half) {}

    void addTo(CLI::App& command);

    /// Adds the ports of both halves, of one machine.
    static void addBothTo(CLI::App& command, PortOption& spectral, PortOption& hotspot);

    /// The service of this machine is meant, whatever was given.
    void setMachine(const std::string& folder);

    /// The port that was given; else that of the environment; else what the parent left in the machine's
    /// folder. Throws ClientError if none tells.
    std::uint16_t find() const;

    /// The machine that was given, or the default one; nothing if a port was given that its service has not
    /// got.
    std::optional<MachineFolder> machine() const;

private:
    void addPortTo(CLI::App& command, const std::string& alias);

    Half m_half;
    std::uint16_t m_port = 0;
    std::string m_machine;
};

/// The port that a command is given as a number, or by the half whose port it is.
class PortArgument {
public:
    void addTo(CLI::App& command);

    /// As PortOption::find().
    std::uint16_t find() const;

private:
    std::string m_given;
    PortOption m_spectral{Half::Spectral};
    PortOption m_hotspot{Half::Hotspot};
};

}  // namespace vexa::client
