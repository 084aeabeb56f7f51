#include "connection/BlockedNetworkList.h"

#include <algorithm>

#include "base/DiagnosticLog.h"
#include "config/CredentialTable.h"
#include "hotspot/CredentialMatching.h"

namespace vexa {

namespace {

constexpr std::uint32_t kRecentLimit = 800;  // milliseconds

const Credential* credentialOf(std::int32_t credId, const CredentialTable& credentials) REQUIRES(g_hs20Lock) {
    const Credential* const credential = credId == 0 ? nullptr : credentials.findCredentialById(credId);
    if (credential == nullptr) Log(6, "ERROR: Cannot get credential.");
    return credential;
}

bool fits(const Credential& credential, const Hs20Network& network, const CredentialMatcher& matcher)
    REQUIRES(g_hs20Lock) {
    const auto found = matcher.findCredentialsForNetwork(network);
    return std::find(found.begin(), found.end(), &credential) != found.end();
}

// Whole milliseconds as an unsigned number, so that a time in the future counts as very long ago.
std::uint32_t age(const TimeValue& since, const TimeValue& now) {
    std::int64_t seconds = std::int64_t{now.seconds} - since.seconds;
    std::int64_t microseconds = std::int64_t{now.microseconds} - since.microseconds;
    if (microseconds < 0) {
        --seconds;
        microseconds += 1000000;
    }
    return static_cast<std::uint32_t>(seconds * 1000 + microseconds / 1000);
}

}  // namespace

std::vector<BlockedNetworkList::BlockedNetwork>::iterator BlockedNetworkList::find(std::string_view ssid) {
    return std::find_if(m_networks.begin(), m_networks.end(),
                        [ssid](const BlockedNetwork& network) { return network.ssid == ssid; });
}

bool BlockedNetworkList::isBlocked(const Hs20Network& network) const {
    return std::any_of(m_networks.begin(), m_networks.end(),
                       [&](const BlockedNetwork& blocked) { return blocked.ssid == network.ssid(); });
}

int BlockedNetworkList::blockNetwork(std::string_view ssid, bool byUser) {
    if (ssid.size() > kMaxSsidLength) return 0;
    Log(3, "We are going to block network with ssid=%s", std::string(ssid).c_str());
    if (find(ssid) != m_networks.end()) return 0;
    m_networks.push_back({std::string(ssid), getTimeValue(), byUser});
    return 1;
}

bool BlockedNetworkList::unblockNetwork(std::string_view ssid) {
    const auto found = find(ssid);
    if (found == m_networks.end()) return false;
    m_networks.erase(found);
    return true;
}

ResultCode BlockedNetworkList::onCredentialAdded(std::int32_t credId, const CredentialTable& credentials,
                                                 const Hs20NetworkList& networks) {
    Log(3, "Newly added credential with id=%d.", credId);
    if (credId < 0) return kInvalidArgument;
    const Credential* const credential = credentialOf(credId, credentials);
    if (credential == nullptr) return kFailure;
    if (!credential->m_bAutoConnect) {
        Log(3, "Credential is not auto-connected, don't unblock any network.");
        return kSuccess;
    }
    const CredentialMatcher matcher(credentials);
    for (auto blocked = m_networks.begin(); blocked != m_networks.end();) {
        const Hs20Network* const network = networks.findBySsid(blocked->ssid);
        if (network == nullptr) Log(6, "ERROR: Invalid BSS.");
        if (network != nullptr && fits(*credential, *network, matcher))
            blocked = m_networks.erase(blocked);
        else
            ++blocked;
    }
    return kSuccess;
}

ResultCode BlockedNetworkList::onCredentialAutoConnectChanged(std::int32_t credId,
                                                              const CredentialTable& credentials,
                                                              const Hs20NetworkList& networks) {
    Log(3, "Credential with id=%d has auto connect property changed.", credId);
    if (credId < 0) return kInvalidArgument;
    const Credential* const credential = credentialOf(credId, credentials);
    if (credential == nullptr) return kFailure;
    const CredentialMatcher matcher(credentials);
    for (const Hs20Network* network : networks.copyPointers()) {
        if (!isBlocked(*network) || !fits(*credential, *network, matcher)) continue;
        Log(3,
            "Unblock network with ssid=%s and mac address=%s due to corresponding credential changed from 'manual connect' to 'auto connect'",
            network->ssidText().c_str(), toText(network->m_macAddress).c_str());
        unblockNetwork(network->ssid());
    }
    return kSuccess;
}

void BlockedNetworkList::unblockRecentNetworks() {
    const TimeValue now = getTimeValue();
    std::erase_if(m_networks, [&](const BlockedNetwork& blocked) {
        if (blocked.bBlockedByUser) {
            Log(3, "This network with ssid=%s has been blocked by user, don't unblock it.",
                blocked.ssid.c_str());
            return false;
        }
        const std::uint32_t milliseconds = age(blocked.blockedTime, now);
        Log(3, "The network with ssid=%s has been blocked for %d millisec", blocked.ssid.c_str(),
            static_cast<int>(milliseconds));
        const bool isRecent = milliseconds < kRecentLimit;
        Log(3, isRecent ? "\tThis network was blocked not long ago, unblock it"
                        : "\tThis network was blocked long time ago, don't unblock it.");
        return isRecent;
    });
}

}  // namespace vexa
