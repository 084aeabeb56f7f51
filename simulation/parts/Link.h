#pragma once

#include <cstddef>
#include <string>

#include "platform/WlanApi.h"
#include "simulation/text/Text.h"

namespace vexa::simulation {

/// A connection or the attempt at one: what notifications and queries tell of it.
struct Link {
    WLAN_INTERFACE_STATE state = wlan_interface_state_disconnected;
    std::size_t adapter = 0;
    GUID guid{};
    WLAN_CONNECTION_MODE mode = wlan_connection_mode_invalid;
    std::u16string profileName;
    Bytes ssid;
    Bytes bssid = Bytes(sizeof(DOT11_MAC_ADDRESS));  ///< Zero while no BSS is known.
    ULONG channel = 0;                               ///< Of that BSS.
};

/// Whether there is something to ask about: an attempt or a connection.
bool isUp(const Link& link);

/// The channel of a connection until it has ended; else 0.
ULONG channelInUse(const Link& link);

/// The data of the ACM notifications of a connection.
Bytes connectionMessage(const Link& link, DWORD reason);

/// What a query for the current connection answers.
Bytes connectionAttributes(const Link& link);

}  // namespace vexa::simulation
