#pragma once

#include <optional>
#include <string>
#include <vector>

#include "client/hotspot/Credential.h"
#include "client/hotspot/Network.h"
#include "client/machine/MachineFolder.h"
#include "client/port/HotspotPort.h"

namespace vexa::client {

inline constexpr const char* kNoAdapter = "no adapter is in";

// What the hotspot half can be asked. Each throws NoAnswer.

/// Nothing if there is no adapter: then there is no list either.
std::optional<NetworkList> askNetworks(HotspotPort& port);

/// The radio's software switch is on.
bool askRadio(HotspotPort& port);

/// The connected network gives access to the internet. Nothing without an adapter.
std::optional<bool> askInternet(HotspotPort& port);

/// Throws ClientError if there is no adapter, or if its radio is off.
void requireRadio(HotspotPort& port);

/// The credentials that are stored. Throws ClientError without an adapter.
CredentialList askCredentials(HotspotPort& port);

/// The names of the credentials with which this connection can have been made, as credentialsBehind() tells.
std::vector<std::string> credentialsOf(const Network& connected, const CredentialList& stored,
                                       const std::optional<MachineFolder>& machine);

/// The hotspot switch as it is written down in the machine. Nothing if the machine is not known.
std::optional<bool> hotspotSwitch(const std::optional<MachineFolder>& machine);

}  // namespace vexa::client
