#include <algorithm>
#include <new>
#include <optional>

#include "base/DiagnosticLog.h"
#include "connection/Supplicant.h"
#include "hotspot/CredentialMatching.h"
#include "text/TextConversion.h"

namespace vexa {

namespace {

using platform::LockGuard;

/// The lines of the log by which a walk through the credentials tells its first step from the later ones.
struct StepLines {
    const char* failed;
    const char* nothingLeft;
};

constexpr StepLines kFirstStep = {"Try to connect to HS20 network failed.",
                                  "No credential found for this HS20 network, turn to use normal routine"};
constexpr StepLines kLaterStep = {
    "ERROR: Try to connect to HS20 network using next credential failed.",
    "We have tried all credentials, connection failed.",
};

// Nothing: no connection follows from the credentials.
std::optional<ResultCode> resultOf(ConnectOutcome outcome, const StepLines& lines) {
    switch (outcome) {
        case kConnectStarted:
            return kSuccess;
        case kConnectFailed:
            Log(6, "%s", lines.failed);
            return kFailure;
        case kNetworkGone:
            Log(3, "WARNING: The network we were connecting is no longer available, a naughty network!");
            return std::nullopt;
        case kConnectNothingLeft:
            Log(3, "%s", lines.nothingLeft);
            return std::nullopt;
    }
    return std::nullopt;
}

// In the log a network that has gone counts as a failure.
int numberInLog(ConnectOutcome outcome) {
    return static_cast<int>(outcome == kNetworkGone ? kConnectFailed : outcome);
}

}  // namespace

ResultCode Supplicant::connectBss(std::string_view ssid) try {
    const LockGuard lock(g_hs20Lock);
    Log(3, "###Manually connect to a BSS started.###");
    if (ssid.empty()) return kInvalidArgument;
    if (!m_engine.m_bConnectionStarted) return connectBssNow(std::string(ssid));
    Log(3,
        "\tConnection has already been started, maybe by auto connecting thread, we will wait until the auto connecting completed, either succeed or fail.");
    m_pendingManualSsid = ssid;
    m_bManualConnectPending = true;
    return kSuccess;
} catch (const std::bad_alloc&) {
    return kFailure;
}

ResultCode Supplicant::connectBssNow(const std::string& ssid) try {
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
    const auto result = resultOf(tryConnectHs20BssUsingNextCredential(ssid), kFirstStep);
    return result ? *result : connectPlainly(ssid);
} catch (const std::bad_alloc&) {
    Log(6, "ERROR: Out of memory, the manual connection was not started.");
    return kFailure;
}

// The operating system chooses the profile; the connection counts as own all the same.
ResultCode Supplicant::connectPlainly(const std::string& ssid) {
    return requestConnection(ssid, nullptr) == ERROR_SUCCESS ? kSuccess : kFailure;
}

ConnectOutcome Supplicant::tryConnectHs20BssUsingNextCredential(std::string_view ssid) {
    Log(3, "Try to connect to HS20 network using next credential.");
    if (ssid.empty()) return kConnectFailed;
    const Hs20Network* const network = m_engine.m_networkList.findBySsid(ssid);
    if (network == nullptr) return kNetworkGone;
    if (!network->m_bHs20) {
        Log(6, "ERROR: we are expecting a HS20 network.");
        return kConnectFailed;
    }
    const Credential* const credential = nextUntried(*network);
    if (credential == nullptr) return kConnectNothingLeft;
    Log(3, "Selecting credential with id=%d", credential->m_id);
    m_triedCredentialIds.push_back(credential->m_id);
    if (connectFreshly(*network, *credential) != kSuccess) return kConnectFailed;
    m_bManualConnectStarted = m_engine.m_bConnectionStarted;
    if (!m_bManualConnectStarted && getConnectedBss(false) == network)
        sendConnectionResult(ConnectionResult::kSucceeded);
    return kConnectStarted;
}

ResultCode Supplicant::tryNextCredential(const WLAN_CONNECTION_NOTIFICATION_DATA& data) {
    Log(3, "Manual connection failed, we will try to use next credential.");
    const std::string_view ssid = bytesOf(data.dot11Ssid);
    const ConnectOutcome outcome = tryConnectHs20BssUsingNextCredential(ssid);
    Log(3, "connResult=%d after invoking tryConnectHs20BssUsingNextCredential.", numberInLog(outcome));
    if (outcome == kConnectStarted)
        LogWide(3, L"Successfully initiated connection to HS20 network=%s using next credential.",
                wideFromNarrow(ssid).c_str());
    const auto result = resultOf(outcome, kLaterStep);
    return result ? *result : endAttempt(data, ConnectionResult::kFailed);
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

// Where no request was needed, what auto-connect goes by is the network's profile as it was, or none.
ResultCode Supplicant::connectFreshly(const Hs20Network& network, const Credential& credential) {
    NetworkProfileMgr& profiles = m_engine.m_profileMgr;
    NetworkProfile* profile = nullptr;
    std::optional<NetworkProfile> replaced;
    if (profiles.findProfileByName(wideFromNarrow(network.ssid()), profile) == kSuccess) {
        if (profile->m_id < 1) return kFailure;
        replaced = *profile;
        profiles.deleteProfile(profile->m_id);
    }
    if (profiles.addProfileFromCredential(credential, network, false, m_engine.m_config.homeRealm(),
                                          profile) != kSuccess)
        return kFailure;
    const ResultCode result = connectToNetwork(network, *profile);
    if (m_engine.m_bConnectionStarted || result != kSuccess) return result;
    if (!replaced) {
        profiles.deleteProfile(profile->m_id);
        return result;
    }
    replaced->m_priority = profile->m_priority;
    *profile = *replaced;
    return result;
}

}  // namespace vexa
