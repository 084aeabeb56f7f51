#include <algorithm>

#include "base/DiagnosticLog.h"
#include "config/ResultCodes.h"
#include "connection/Supplicant.h"
#include "hotspot/CredentialMatching.h"
#include "text/TextConversion.h"

namespace vexa {

namespace {

using platform::LockGuard;

}  // namespace

int Supplicant::connectBss(std::string_view ssid) {
    const LockGuard lock(g_hs20Lock);
    Log(3, "###Manually connect to a BSS started.###");
    if (ssid.empty()) return kInvalidArgument;
    if (!m_engine.m_bConnectionStarted) return connectBssNow(std::string(ssid));
    Log(3,
        "\tConnection has already been started, maybe by auto connecting thread, we will wait until the auto connecting completed, either succeed or fail.");
    m_bManualConnectPending = true;
    m_pendingManualSsid = ssid;
    return kSuccess;
}

int Supplicant::connectBssNow(const std::string& ssid) {
    Log(3, "###We are actually going to connect to HS20 network now.###");
    Hs20Network* const network = m_engine.m_networkList.findBySsid(ssid);
    if (network == nullptr) return kFailure;
    m_engine.m_blockedNetworks.unblockNetwork(network->ssid());
    Log(3, "Unblocked network with ssid=%s and mac address=%s due to user has manually connected to it.",
        network->ssidText().c_str(), toText(network->m_macAddress).c_str());
    if (!network->m_bHs20) return connectPlainly(ssid);
    if (!network->hasRealmData()) {
        Log(3,
            "The ANQP info of the network to be connected has no realm info,which should be fetched earlier.");
        return kSuccess;
    }
    m_triedCredentialIds.clear();
    int connResult = 0;
    const int result = tryConnectHs20BssUsingNextCredential(ssid, connResult);
    if (result == kFailure) {
        Log(6, "Try to connect to HS20 network failed.");
        return kFailure;
    }
    if (result == kSuccess && connResult == kConnectStarted) return kSuccess;
    if (result == kNetworkGone)
        Log(3, "WARNING: The network we were connecting is no longer available, a naughty network!");
    else if (result != kSuccess)
        Log(6, "Unexpected error code.");
    else if (connResult == kConnectNothingLeft)
        Log(3, "No credential found for this HS20 network, turn to use normal routine");
    else
        Log(6, "ERROR: invalid ret code.");
    return connectPlainly(ssid);
}

// The operating system chooses the profile; the connection counts as own all the same.
int Supplicant::connectPlainly(const std::string& ssid) {
    return requestConnection(ssid, nullptr) == ERROR_SUCCESS ? kSuccess : kFailure;
}

int Supplicant::tryConnectHs20BssUsingNextCredential(std::string_view ssid, int& connResult) {
    Log(3, "Try to connect to HS20 network using next credential.");
    connResult = 0;
    if (ssid.empty()) return kFailure;
    const Hs20Network* const network = m_engine.m_networkList.findBySsid(ssid);
    if (network == nullptr) return kNetworkGone;
    if (!network->m_bHs20) {
        Log(6, "ERROR: we are expecting a HS20 network.");
        return kFailure;
    }
    const Credential* const credential = nextUntried(*network);
    if (credential == nullptr) {
        connResult = kConnectNothingLeft;
        return kSuccess;
    }
    Log(3, "Selecting credential with id=%d", credential->m_id);
    m_triedCredentialIds.push_back(credential->m_id);
    if (connectFreshly(*network, *credential) != kSuccess) return kFailure;
    m_bManualConnectStarted = true;
    connResult = kConnectStarted;
    return kSuccess;
}

const Credential* Supplicant::nextUntried(const Hs20Network& network) {
    const auto found = CredentialMatcher(m_engine.m_config.credentials()).findCredentialsForNetwork(network);
    for (const Credential* credential : found) {
        if (std::find(m_triedCredentialIds.begin(), m_triedCredentialIds.end(), credential->m_id) ==
            m_triedCredentialIds.end())
            return credential;
        Log(3, "We have tried credential with id=%d, skipping...", credential->m_id);
    }
    return nullptr;
}

int Supplicant::connectFreshly(const Hs20Network& network, const Credential& credential) {
    NetworkProfile* profile = nullptr;
    if (m_engine.m_profileMgr.findProfileByName(wideFromNarrow(network.ssid()), profile) == kSuccess) {
        if (profile->m_id < 1) return kFailure;
        m_engine.m_profileMgr.deleteProfile(profile->m_id);
    }
    if (m_engine.m_profileMgr.addProfileFromCredential(credential, network, false,
                                                       m_engine.m_config.homeRealm(), profile) != kSuccess)
        return kFailure;
    return connectToNetwork(&network, profile);
}

}  // namespace vexa
