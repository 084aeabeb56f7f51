#pragma once

#include <optional>

#include "client/HotspotOptions.h"
#include "client/HotspotPort.h"
#include "client/Network.h"

namespace vexa::client {

inline constexpr const char* kNetworkList = "GET_ALL_NETWORK_LIST";
inline constexpr const char* kNoAdapter = "no adapter is in";

// What the hotspot half can be asked. Each throws NoAnswer.

/// Nothing if there is no adapter: then there is no list either.
std::optional<NetworkList> askNetworks(HotspotPort& port);

/// The radio's software switch is on.
bool askRadio(HotspotPort& port);

/// The connected network gives access to the internet. Nothing without an adapter.
std::optional<bool> askInternet(HotspotPort& port);

/// The hotspot switch as it is written down in the machine. Nothing if the machine is not known.
std::optional<bool> hotspotSwitch(const HotspotOptions& options);

}  // namespace vexa::client
