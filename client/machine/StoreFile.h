#pragma once

#include <filesystem>
#include <optional>
#include <string>

#include "client/machine/MachineFolder.h"

namespace vexa::client {

/// The file in which the service keeps the credentials, as it lies in the machine's folder. The protocol does
/// not tell whether a change has come into it, or whether it could be read.
class StoreFile {
public:
    explicit StoreFile(const MachineFolder& machine) : m_path(machine.configFile()) {}

    /// From now on isWritten() speaks of what comes.
    void look() { m_seen = state(); }

    /// Somebody has written the file since look(), and credentials have a place in it.
    bool isWritten() const;

    /// Why the service cannot read it, as in "X is not well-formed XML"; nothing if it can.
    std::optional<std::string> objection() const;

    /// Why the service has not written it.
    std::string whyNotWritten() const;

private:
    struct State {
        std::string content;
        std::filesystem::file_time_type time;
        bool operator==(const State&) const = default;
    };

    std::optional<State> state() const;

    std::filesystem::path m_path;
    std::optional<State> m_seen;
};

}  // namespace vexa::client
