#include <string>
#include <string_view>
#include <utility>

#include "base/DiagnosticLog.h"
#include "connection/Supplicant.h"
#include "connection/SupplicantMgr.h"
#include "hotspot/CredentialMatching.h"

namespace vexa {

namespace {

using platform::LockGuard;

}  // namespace

// Null: the operating system chooses the profile.
DWORD Supplicant::requestConnection(std::string_view ssid, const NetworkProfile* profile) {
    std::string connecting(ssid);  // before it is asked for: the connection must be known as own
    const DWORD result =
        profile == nullptr ? m_wlan.connectBySsid(ssid) : m_wlan.connectByProfile(profile->m_profileXml);
    if (result != ERROR_SUCCESS) return result;
    m_connectingSsid = std::move(connecting);
    m_engine.m_bConnectionStarted = true;
    return result;
}

// The notifications of the connection may come at once; they wait for the lock.
ResultCode Supplicant::connectToNetwork(const Hs20Network& network, const NetworkProfile& profile) {
    LogWide(3, L"\nConnect to network %s", profile.m_name.c_str());
    if (m_state == SupplicantState::Connected) {
        const Hs20Network* const connected = getConnectedBss(false);
        if (connected == nullptr) Log(3, "Supplicant connected to a legacy network.");
        if (connected == &network) {
            Log(3,
                "Already in connected state while requesting to connect to the same network, skip connecting again.");
            return kSuccess;
        }
    }
    if (m_engine.m_bConnectionStarted) {
        Log(3, "###Connection already started, skip connecting again.###");
        return kSuccess;
    }
    if (findRoamingConsortiumCredential(m_engine.m_config.credentials(), network) != nullptr) return kSuccess;
    Log(2, "Network profile for ssid=%s", network.ssidText().c_str());
    Log(2, "\tInterworking: Connect with %s", toText(network.m_macAddress).c_str());
    if (network.m_ssidLength == 0) return kFailure;
    const DWORD result = requestConnection(network.ssid(), &profile);
    if (result == ERROR_SUCCESS) return kSuccess;
    Log(2, "WlanConnect call failed with error code=%d.", static_cast<int>(result));
    return kFailure;
}

void Supplicant::disconnectBss(std::string_view ssid) {
    const LockGuard lock(g_hs20Lock);
    const Hs20Network* const connected = getConnectedBss(true);
    if (connected == nullptr) return Log(6, "ERROR: Cannot get connected BSS.");
    if (connected->ssidText() != ssid)
        return Log(6, "ERROR: Connected ssid=%s while requesting disconnect from ssid=%s",
                   connected->ssidText().c_str(), std::string(ssid).c_str());
    if (disconnectedBSS(Leave::Hs20AndBlock) != kSuccess) Log(6, "ERROR: disconnectedBSS call failed.");
}

// A connection hides what ANQP would answer, so it has to go first; the query follows when it has gone.
void Supplicant::updateNetworkRealm() {
    const LockGuard lock(g_hs20Lock);
    if (queryState() != SupplicantState::Connected) {
        queryHs20NetworkAnqpInfo();
        return;
    }
    disconnectedBSS(Leave::Any);
    m_mgr.awaitRealmUpdate();
}

// The block comes first: when the disconnection is reported, the network is on the list already.
ResultCode Supplicant::disconnectedBSS(Leave what) {
    Log(3, "Disconnecting from connecting/connected BSS...");
    const Hs20Network* const network = getConnectedBss(true);
    if (network == nullptr && what != Leave::Any) {
        Log(6,
            "ERROR: We are requested to disconnect from a HS20 network,but we cannot found a connected HS20 network.");
        return kFailure;
    }
    Log(3, network != nullptr ? "Manually disconnect from a HS20 network."
                              : "Manually disconnect from a non-HS20 network.");
    if (what == Leave::Hs20AndBlock && network != nullptr) {
        m_engine.m_blockedNetworks.blockNetwork(network->ssid(), true);
        Log(3,
            "The network with ssid=%s and mac address=%s has been blocked due to user manually disconnect from this network.",
            network->ssidText().c_str(), toText(network->m_macAddress).c_str());
    }
    const bool isRequested = m_wlan.disconnect() == ERROR_SUCCESS;
    m_bUserDisconnecting = true;
    return isRequested ? kSuccess : kFailure;
}

}  // namespace vexa
