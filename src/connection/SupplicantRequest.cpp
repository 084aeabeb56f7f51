#include <string_view>

#include "base/DiagnosticLog.h"
#include "config/Config.h"
#include "config/ResultCodes.h"
#include "connection/Supplicant.h"
#include "connection/SupplicantMgr.h"
#include "hotspot/CredentialMatching.h"

namespace vexa {

// Null: the operating system chooses the profile.
DWORD Supplicant::requestConnection(std::string_view ssid, const NetworkProfile* profile) {
    const DWORD result =
        profile == nullptr ? m_wlan.connectBySsid(ssid) : m_wlan.connectByProfile(profile->m_profileXml);
    if (result != ERROR_SUCCESS) return result;
    m_connectingSsid = ssid;
    m_bConnectionStarted = true;
    return result;
}

// The notifications of the connection may come at once; they wait for the lock.
int Supplicant::connectToNetwork(const Hs20Network* network, const NetworkProfile* profile) {
    if (network == nullptr || profile == nullptr) return kInvalidArgument;
    LogWide(3, L"\nConnect to network %s", profile->m_name.c_str());
    if (m_state == SupplicantState::Connected) {
        const Hs20Network* const connected = getConnectedBss(false);
        if (connected == nullptr) Log(3, "Supplicant connected to a legacy network.");
        if (connected == network) {
            Log(3,
                "Already in connected state while requesting to connect to the same network, skip connecting again.");
            return kSuccess;
        }
    }
    if (m_bConnectionStarted) {
        Log(3, "###Connection already started, skip connecting again.###");
        return kSuccess;
    }
    if (m_pMgr != nullptr &&
        findRoamingConsortiumCredential(m_pMgr->config().credentials(), *network) != nullptr)
        return kSuccess;
    Log(2, "Network profile for ssid=%s", network->ssidText().c_str());
    Log(2, "\tInterworking: Connect with %s", toText(network->m_macAddress).c_str());
    if (network->m_ssidLength == 0) return kFailure;
    const DWORD result = requestConnection(network->ssid(), profile);
    if (result == ERROR_SUCCESS) return kSuccess;
    Log(2, "WlanConnect call failed with error code=%d.", static_cast<int>(result));
    return kFailure;
}

}  // namespace vexa
