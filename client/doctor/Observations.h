#pragma once

#include <chrono>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "client/doctor/LogFacts.h"
#include "client/hotspot/Credential.h"
#include "client/hotspot/Network.h"
#include "client/machine/MachineFolder.h"
#include "client/terminal/Signals.h"

namespace vexa::client {

/// What can be seen of a service from outside. What could not be asked is nothing.
struct Observations {
    /// Why it could not be asked further; empty if it could.
    std::string serviceTrouble;
    std::optional<bool> hasAdapter;
    std::optional<bool> isRadioOn;
    std::optional<bool> isHotspotOn;
    std::optional<NetworkList> networks;
    std::optional<CredentialList> credentials;
    /// With which of them the connection can have been made.
    std::vector<std::string> connectedWith;
    std::optional<bool> hasInternet;
    std::optional<LogFacts> log;
    /// Why there is nothing of the log.
    std::string whyNoLog;
};

/// Asks the service on this port; the registry and the log where its machine is known. Throws StoppedByUser,
/// and nothing for a service that does not answer.
Observations observe(std::uint16_t port, Signals& signals, std::chrono::milliseconds limit,
                     const std::optional<MachineFolder>& machine);

}  // namespace vexa::client
