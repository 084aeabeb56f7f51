#pragma once

#include <string>

namespace vexa::contract {

// What stands in the registry.

/// Below the user's root.
inline constexpr const char* kProductKey = "Software\\Korvane\\Vexa";
/// Text: the hotspot switch, "false" in any case for off. The service reads it when it starts and never
/// writes it.
inline constexpr const char* kHotspotSwitchValue = "IsHotSpotAutoConnect";
/// Number: the EAP method of the connection that the service has made, 0 if there is none.
inline constexpr const char* kEapMethodValue = "EapMethod";

/// The whole path of that key, as it stands in what a simulated machine keeps of its registry.
inline std::string productKeyPath() {
    return std::string("HKEY_CURRENT_USER\\") + kProductKey;
}

/// Below the root of the machine: a subkey for each network adapter.
inline constexpr const char* kNetworkAdapterClassKey =
    "SYSTEM\\CurrentControlSet\\Control\\Class\\{4D36E972-E325-11CE-BFC1-08002BE10318}";

}  // namespace vexa::contract
