#include "simulation/parts/Link.h"

#include <algorithm>

#include "simulation/text/Wire.h"

namespace vexa::simulation {

namespace {

constexpr ULONG kSignalQuality = 80;  // percent
constexpr ULONG kRate = 150000;       // kbit/s
constexpr int kPhyHt = 7;
constexpr int kAuthenticationRsna = 6;
constexpr int kCipherCcmp = 4;

// A longer name is cut; its block ends with a NUL all the same.
void storeName(WCHAR (&field)[WLAN_MAX_NAME_LENGTH], const std::u16string& name) {
    std::copy_n(name.begin(), std::min<std::size_t>(name.size(), WLAN_MAX_NAME_LENGTH - 1),
                static_cast<WCHAR*>(field));
}

// An enumeration of the SDK, or a number where its names aren't used.
template <class Field>
void assign(Field& field, int value) {
    field = static_cast<Field>(value);
}

DOT11_SSID ssidField(const Bytes& ssid) {
    DOT11_SSID field{};
    field.uSSIDLength = static_cast<ULONG>(ssid.size());
    std::copy(ssid.begin(), ssid.end(), static_cast<UCHAR*>(field.ucSSID));
    return field;
}

}  // namespace

bool isUp(const Link& link) {
    return link.state == wlan_interface_state_connected || link.state == wlan_interface_state_associating ||
           link.state == wlan_interface_state_authenticating;
}

ULONG channelInUse(const Link& link) {
    const bool isInUse =
        link.state == wlan_interface_state_connected || link.state == wlan_interface_state_disconnecting;
    return isInUse ? link.channel : 0;
}

Bytes connectionMessage(const Link& link, DWORD reason) {
    WLAN_CONNECTION_NOTIFICATION_DATA block{};
    block.wlanConnectionMode = link.mode;
    storeName(block.strProfileName, link.profileName);
    block.dot11Ssid = ssidField(link.ssid);
    block.dot11BssType = dot11_BSS_type_infrastructure;
    block.bSecurityEnabled = TRUE;
    block.wlanReasonCode = reason;
    return bytesOf(block);
}

Bytes connectionAttributes(const Link& link) {
    WLAN_CONNECTION_ATTRIBUTES block{};
    block.isState = link.state;
    block.wlanConnectionMode = link.mode;
    storeName(block.strProfileName, link.profileName);
    WLAN_ASSOCIATION_ATTRIBUTES& association = block.wlanAssociationAttributes;
    association.dot11Ssid = ssidField(link.ssid);
    association.dot11BssType = dot11_BSS_type_infrastructure;
    std::copy(link.bssid.begin(), link.bssid.end(), static_cast<UCHAR*>(association.dot11Bssid));
    assign(association.dot11PhyType, kPhyHt);
    association.wlanSignalQuality = kSignalQuality;
    association.ulRxRate = kRate;
    association.ulTxRate = kRate;
    WLAN_SECURITY_ATTRIBUTES& security = block.wlanSecurityAttributes;
    security.bSecurityEnabled = TRUE;
    security.bOneXEnabled = TRUE;
    assign(security.dot11AuthAlgorithm, kAuthenticationRsna);
    assign(security.dot11CipherAlgorithm, kCipherCcmp);
    return bytesOf(block);
}

}  // namespace vexa::simulation
