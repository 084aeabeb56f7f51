#include <algorithm>

#include "base/WlanMemory.h"
#include "config/ResultCodes.h"
#include "connection/Supplicant.h"

namespace vexa {

int Supplicant::queryCurrentConnection(DOT11_SSID& ssid, MacAddress& bssid, bool includeConnecting) const {
    const auto state = queryInterface<WLAN_INTERFACE_STATE>(
        m_hWlan, m_interfaceGuid, wlan_intf_opcode_interface_state, sizeof(WLAN_INTERFACE_STATE));
    if (!state) return kFailure;
    const bool isConnecting =
        *state == wlan_interface_state_associating || *state == wlan_interface_state_authenticating;
    if (*state != wlan_interface_state_connected && !(includeConnecting && isConnecting)) return kFailure;
    const auto connection = queryInterface<WLAN_CONNECTION_ATTRIBUTES>(
        m_hWlan, m_interfaceGuid, wlan_intf_opcode_current_connection, sizeof(WLAN_CONNECTION_ATTRIBUTES));
    if (!connection) return kFailure;
    const WLAN_ASSOCIATION_ATTRIBUTES& association = connection->wlanAssociationAttributes;
    ssid = association.dot11Ssid;
    std::copy_n(std::begin(association.dot11Bssid), bssid.size(), bssid.begin());
    return kSuccess;
}

Hs20Network* Supplicant::getConnectedBss(bool includeConnecting) const {
    DOT11_SSID ssid{};
    MacAddress bssid{};
    if (queryCurrentConnection(ssid, bssid, includeConnecting) != kSuccess) return nullptr;
    return m_networkList.findBySsid(bytesOf(ssid));
}

DWORD Supplicant::requestDisconnect() const {
    return WlanDisconnect(m_hWlan, &m_interfaceGuid, nullptr);
}

}  // namespace vexa
