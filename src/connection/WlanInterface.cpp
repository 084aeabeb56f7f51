#include "connection/WlanInterface.h"

#include <algorithm>
#include <iterator>

#include "base/DiagnosticLog.h"
#include "base/WlanMemory.h"
#include "base/WlanText.h"

namespace vexa {

namespace {

SupplicantState stateOf(WLAN_INTERFACE_STATE state) {
    switch (state) {
        case wlan_interface_state_connected:
            return SupplicantState::Connected;
        case wlan_interface_state_disconnecting:
            return SupplicantState::Disconnecting;
        case wlan_interface_state_disconnected:
            return SupplicantState::Disconnected;
        case wlan_interface_state_associating:
            return SupplicantState::Associating;
        case wlan_interface_state_discovering:
            return SupplicantState::Scanning;
        case wlan_interface_state_authenticating:
            return SupplicantState::Authenticating;
        default:
            return SupplicantState::InvalidState;
    }
}

DOT11_SSID ssidField(std::string_view bytes) {
    DOT11_SSID ssid{};
    ssid.uSSIDLength = static_cast<ULONG>(std::min(bytes.size(), kMaxSsidLength));
    std::transform(bytes.begin(), bytes.begin() + static_cast<std::ptrdiff_t>(ssid.uSSIDLength),
                   std::begin(ssid.ucSSID), [](char byte) { return static_cast<UCHAR>(byte); });
    return ssid;
}

WlanMemory<WLAN_INTERFACE_STATE> interfaceState(HANDLE handle, const GUID& guid) {
    return queryInterface<WLAN_INTERFACE_STATE>(handle, guid, wlan_intf_opcode_interface_state,
                                                sizeof(WLAN_INTERFACE_STATE));
}

}  // namespace

bool WlanInterface::open() {
    if (m_handle.open() != ERROR_SUCCESS) {
        Log(3, "WlanOpenHandle failed in supplicant initialization.");
        return false;
    }
    if (m_handle.get() == nullptr) {
        Log(3, "Invalid WLAN handle value.");
        return false;
    }
    return true;
}

SupplicantState WlanInterface::queryState() const {
    if (const auto state = interfaceState(m_handle.get(), m_guid)) return stateOf(*state);
    Log(3, "WlanQueryInterface failed in Supplicant::queryState.");
    return SupplicantState::InvalidState;
}

bool WlanInterface::isRadioOn() const {
    const auto radio = queryInterface<WLAN_RADIO_STATE>(m_handle.get(), m_guid, wlan_intf_opcode_radio_state,
                                                        kMinimumRadioState);
    return !radio || radio->PhyRadioState[0].dot11SoftwareRadioState != dot11_radio_state_off;
}

std::optional<CurrentConnection> WlanInterface::queryCurrentConnection(bool includeConnecting) const {
    const auto state = interfaceState(m_handle.get(), m_guid);
    if (!state) return std::nullopt;
    const bool isConnecting =
        *state == wlan_interface_state_associating || *state == wlan_interface_state_authenticating;
    if (*state != wlan_interface_state_connected && !(includeConnecting && isConnecting)) return std::nullopt;
    const auto connection = queryInterface<WLAN_CONNECTION_ATTRIBUTES>(
        m_handle.get(), m_guid, wlan_intf_opcode_current_connection, sizeof(WLAN_CONNECTION_ATTRIBUTES));
    if (!connection) return std::nullopt;
    const WLAN_ASSOCIATION_ATTRIBUTES& association = connection->wlanAssociationAttributes;
    CurrentConnection current{association.dot11Ssid, {}};
    std::copy_n(std::begin(association.dot11Bssid), current.bssid.size(), current.bssid.begin());
    return current;
}

DWORD WlanInterface::tellModule(std::vector<std::byte> request) const {
    DWORD returned = 0;
    return callModule(request, {}, returned);
}

DWORD WlanInterface::askModule(std::vector<std::byte> request, std::vector<std::byte>& reply) const {
    DWORD returned = 0;
    reply.assign(kIhvReplySize, std::byte{0});
    const DWORD result = callModule(request, reply, returned);
    reply.resize(std::min<std::size_t>(returned, reply.size()));
    return result;
}

DWORD WlanInterface::callModule(std::vector<std::byte>& request, std::span<std::byte> reply,
                                DWORD& returned) const {
    return WlanIhvControl(m_handle.get(), &m_guid, wlan_ihv_control_type_service,
                          static_cast<DWORD>(request.size()), request.data(),
                          static_cast<DWORD>(reply.size()), reply.data(), &returned);
}

DWORD WlanInterface::connectByProfile(const std::wstring& profileXml) const {
    const std::basic_string<WCHAR> text = toWlanText(profileXml);
    WLAN_CONNECTION_PARAMETERS parameters{};
    parameters.wlanConnectionMode = wlan_connection_mode_temporary_profile;
    parameters.strProfile = text.c_str();
    return connect(parameters);
}

DWORD WlanInterface::connectBySsid(std::string_view ssid) const {
    DOT11_SSID field = ssidField(ssid);
    WLAN_CONNECTION_PARAMETERS parameters{};
    parameters.wlanConnectionMode = wlan_connection_mode_discovery_secure;
    parameters.pDot11Ssid = &field;
    return connect(parameters);
}

DWORD WlanInterface::connect(WLAN_CONNECTION_PARAMETERS parameters) const {
    parameters.dot11BssType = dot11_BSS_type_infrastructure;
    parameters.dwFlags = WLAN_CONNECTION_HIDDEN_NETWORK;
    return WlanConnect(m_handle.get(), &m_guid, &parameters, nullptr);
}

DWORD WlanInterface::disconnect() const {
    return WlanDisconnect(m_handle.get(), &m_guid, nullptr);
}

}  // namespace vexa
