#include "client/log/LogLevels.h"

#include <algorithm>
#include <array>

namespace vexa::client {

namespace {

constexpr int kTrace = 3;

struct Beginning {
    int level;
    std::string_view text;
};

// The normal trace is not here, so that what it gains needs nothing.
constexpr std::array kBeginnings{
    Beginning{6, "Add network profile from credential failed."},
    Beginning{6, "Disconnected time not specified for last connection, ssid="},
    Beginning{6, "ERROR: "},
    Beginning{6, "Error: getHs20BssListFromIHV failed in hs20Associate."},
    Beginning{6, "No connection history info while we disconnected from a network."},
    Beginning{6, "Notification data is invalid: either no data or data size is too small."},
    Beginning{6, "Time out when waiting for network connecting thread termination."},
    Beginning{6, "Try to connect to HS20 network failed."},
    Beginning{6, "Unexpected EAP method."},
    Beginning{6, "Unsupported module."},
    Beginning{6, "connectBss failed."},
    Beginning{6, "connectNetwork returns error."},
    Beginning{5, "Connection history entries overflow, clear all entries."},
    Beginning{4, "Check command line arguments succeeded, saPort="},
    Beginning{4, "Checking command line arguments failed."},
    Beginning{4, "Checking command line arguments: "},
    Beginning{4, "Enter addSupplicantIfInterfaceExists..."},
    Beginning{4, "Enter removeSupplicantIfInterfaceRemoved..."},
    Beginning{4, "Initialize SupplicantMgr failed."},
    Beginning{4, "No command line arguments, exit."},
    Beginning{4, "Start to add a HS20 supplicant."},
    Beginning{4, "Start to remove HS20 supplicant."},
    Beginning{2, "!!!Cannot query interface mac address."},
    Beginning{2, "!!!Creating a new network profile"},
    Beginning{2, "!!!Query interface mac address succeeded, mac address "},
    Beginning{2, "Adding a new EAP-TLS network profile with auth mode="},
    Beginning{2, "Adding a new EAP-TTLS network profile..."},
    Beginning{2, "Authentication Parameter Value"},
    Beginning{2, "Call to "},
    Beginning{2, "Initializing supplicant..."},
    Beginning{2, "Interface GUID: "},
    Beginning{2, "Interworking: AP domain name"},
    Beginning{2, "Interworking: Search for match with home SP FQDN "},
    Beginning{2, "InterworkingMgr not deinited!"},
    Beginning{2, "Invalid NAI Realm Count "},
    Beginning{2, "Invalid credential id="},
    Beginning{2, "Invalid credential type."},
    Beginning{2, "Network profile for ssid="},
    Beginning{2, "No room for Authentication Parameter subfield"},
    Beginning{2, "No room for EAP Method Count"},
    Beginning{2, "No room for EAP Method fixed fields"},
    Beginning{2, "No room for EAP Method subfield"},
    Beginning{2, "No room for EAP Methods"},
    Beginning{2, "No room for NAI Realm (len="},
    Beginning{2, "No room for NAI Realm Data (len="},
    Beginning{2, "No room for NAI Realm Data fixed fields"},
    Beginning{2, "Reading all credentials..."},
    Beginning{2, "Reading all user info..."},
    Beginning{2, "Retrieved total "},
    Beginning{2, "Saving credentials to xml file..."},
    Beginning{2, "The NetworkingMgr thread is to be terminated..."},
    Beginning{2, "Unknown credential type."},
    Beginning{2, "Unsupported Authentication Parameter: id="},
    Beginning{2, "WlanConnect call failed with error code="},
    Beginning{2, "\tDumping all credentials..."},
    Beginning{2, "\tInitializing InterworkingMgr."},
    Beginning{2, "\tInterworking: Connect with "},
    Beginning{2, "\tNAI Realm Count: "},
    Beginning{2, "\tNAI Realm="},
    Beginning{2, "\tReading credential with index="},
    Beginning{2, "\tReading user info with index="},
    Beginning{2, "\t\tCreating InterworkingMgr working thread."},
    Beginning{2, "\t\tEAP Method: len="},
    Beginning{2, "\t\t\tid="},
    Beginning{2, "\t\tcredential count="},
    Beginning{2, "wlan_notification_acm_connection_start"},
    Beginning{2, "wlan_notification_msm_adapter_operation_mode_change"},
    Beginning{2, "wlan_notification_msm_adapter_removal"},
    Beginning{2, "wlan_notification_msm_associating"},
    Beginning{2, "wlan_notification_msm_connected"},
    Beginning{2, "wlan_notification_msm_disassociating"},
    Beginning{2, "wlan_notification_msm_disconnected"},
    Beginning{2, "wlan_notification_msm_end"},
    Beginning{2, "wlan_notification_msm_peer_join"},
    Beginning{2, "wlan_notification_msm_peer_leave"},
    Beginning{2, "wlan_notification_msm_radio_state_change"},
    Beginning{2, "wlan_notification_msm_signal_quality_change"},
    Beginning{2, "wlan_notification_msm_start"}};

}  // namespace

int levelOfText(std::string_view text) {
    const auto* const known = std::find_if(kBeginnings.begin(), kBeginnings.end(),
                                           [&](const Beginning& one) { return text.starts_with(one.text); });
    return known == kBeginnings.end() ? kTrace : known->level;
}

}  // namespace vexa::client
