#include <new>
#include <string>

#include "base/DiagnosticLog.h"
#include "connection/EngineState.h"
#include "connection/InterworkingMgr.h"
#include "connection/Supplicant.h"
#include "hotspot/CredentialMatching.h"
#include "text/TextConversion.h"

namespace vexa {

namespace {

using platform::LockGuard;

std::string narrow(const std::wstring& text) {
    return narrowFromWide(text);
}

void logCandidate(const Credential& credential) {
    if (!DiagnosticLog::isEnabled()) return;
    Log(3, "\tChecking credential with id=%d name=%s, realm=%s, priority=%d", credential.m_id,
        narrow(credential.m_credName).c_str(), narrow(credential.m_realm).c_str(), credential.m_priority);
}

void logChoice(const NetworkChoice& best, const NetworkChoice& next) {
    if (best.network == nullptr)
        Log(3, "\tSelecting credential with id=%d name=%s and bss with ssid=%s", next.credential->m_id,
            narrow(next.credential->m_credName).c_str(), next.network->ssidText().c_str());
    else
        Log(3,
            "\tSelecting credential with id=%d name=%s and bss with ssid=%s\tReplacing credential with id=%d name=%s and ssid=%s",
            next.credential->m_id, narrow(next.credential->m_credName).c_str(),
            next.network->ssidText().c_str(), best.credential->m_id,
            narrow(best.credential->m_credName).c_str(), best.network->ssidText().c_str());
}

}  // namespace

// The first credential by priority that may be used for auto-connect and has attempts left.
const Credential* InterworkingMgr::selectCredential(const Hs20Network& network,
                                                    const std::vector<const Credential*>& found) {
    Log(3, "\n\tFound %d credentials", static_cast<int>(found.size()));
    Log(3, "\tChecking found credentials...");
    const CredentialTable& credentials = m_engine.m_config.credentials();
    for (const Credential* credential : found) {
        logCandidate(*credential);
        if (!credential->m_bAutoConnect) {
            Log(3, "Credential is not configured as auto-connect, skipping...");
            continue;
        }
        if (!m_engine.m_retryHelper.isRetryAllowed(credentials, credential->m_id, network.ssid())) {
            Log(3, "\tRetry number exceeds maximum retry limit, skip this credential id=%d, ssid=%s",
                credential->m_id, network.ssidText().c_str());
            continue;
        }
        Log(3, "\tSelected cred id=%d", credential->m_id);
        return credential;
    }
    Log(3, "\t No credential found.");
    return nullptr;
}

// A network of the user's own provider ends the search; among all others the credential's priority decides,
// and the earlier network on a tie.
NetworkChoice InterworkingMgr::findBestMatchBssAndCredential() {
    const CredentialTable& credentials = m_engine.m_config.credentials();
    const CredentialMatcher matcher(credentials);
    NetworkChoice best;
    int index = 0;
    for (Hs20Network* network : m_engine.m_networkList.copyPointers()) {
        ++index;
        if (network->m_ssidLength == 0) continue;
        const std::string ssid = network->ssidText();
        if (m_engine.m_blockedNetworks.isBlocked(*network)) {
            Log(3, "This network has been disconnected by user, skip auto connecting to ssid=%s",
                ssid.c_str());
            continue;
        }
        Log(3, "------------------------------------------------------------------");
        Log(3, "\t[%d] Checking HS20 network with ssid=####%s#### and bssid=%s", index, ssid.c_str(),
            toText(network->m_macAddress).c_str());
        const auto found = matcher.findCredentialsForNetwork(*network);
        if (found.empty()) {
            Log(0, "\t No credential found.");
            continue;
        }
        const NetworkChoice choice{network, selectCredential(*network, found)};
        if (choice.credential == nullptr) continue;
        if (best.network == nullptr || choice.credential->m_priority < best.credential->m_priority) {
            logChoice(best, choice);
            best = choice;
        }
        const bool isHomeSp = isHomeSpNetwork(credentials, network->m_anqpDomainName);
        Log(3, "\n\tHome SP ssid=%s, bHomeSP=%d", ssid.c_str(), isHomeSp ? 1 : 0);
        if (isHomeSp) return choice;
    }
    return best;
}

// The profile of the SSID if it suits the credential; else none, and the unsuitable one has gone with its
// count.
NetworkProfile* InterworkingMgr::reusableProfile(const NetworkChoice& choice, const std::wstring& name) {
    NetworkProfile* profile = nullptr;
    if (m_engine.m_profileMgr.findProfileByName(name, profile) != kSuccess) return nullptr;
    LogWide(3, L"Profile exists for ssid=%s", name.c_str());
    if (profile->m_eapMethod == choice.credential->m_eapMethod && !profile->m_bMachineAuth) {
        Log(3, "\tEAP method matches, don't create new profile.");
        return profile;
    }
    Log(3, "\tEAP method doesn't matches, create new profile.");
    m_engine.m_retryHelper.removeNumRetryEntries(choice.credential->m_id, choice.network->ssid());
    m_engine.m_profileMgr.deleteProfile(profile->m_id);
    return nullptr;
}

NetworkProfile* InterworkingMgr::profileFor(const NetworkChoice& choice, const std::wstring& name) {
    if (NetworkProfile* const existing = reusableProfile(choice, name)) return existing;
    Log(2, "!!!Creating a new network profile");
    NetworkProfile* profile = nullptr;
    if (m_engine.m_profileMgr.addProfileFromCredential(*choice.credential, *choice.network, false,
                                                       m_engine.m_config.homeRealm(), profile) != kSuccess) {
        Log(6, "ERROR: Cannot add network profile.");
        return nullptr;
    }
    m_engine.m_retryHelper.setNumRetries(choice.credential->m_id, choice.network->ssid(), 0);
    return profile;
}

// An attempt that couldn't be made for lack of memory doesn't count.
ResultCode InterworkingMgr::countAndConnect(const NetworkChoice& choice, const NetworkProfile& profile) {
    NetworkRetryHelper& retries = m_engine.m_retryHelper;
    const std::int32_t id = choice.credential->m_id;
    const std::uint32_t before = retries.getNumRetries(id, choice.network->ssid());
    retries.increaseNumRetries(id, choice.network->ssid());
    try {
        return m_supplicant.connectToNetwork(*choice.network, profile);
    } catch (const std::bad_alloc&) {
        retries.setNumRetries(id, choice.network->ssid(), before);
        throw;
    }
}

ConnectOutcome InterworkingMgr::connectNetwork() {
    const LockGuard lock(g_hs20Lock);
    Log(3, "\n>>>> Enter connectNetwork");
    // The gates are passed without the lock: the next step of an attempt may have begun since. Its profile
    // and its count are not to be touched.
    if (m_engine.m_bConnectionStarted) {
        Log(3, "###Connection already started, skip connecting again.###");
        return kConnectStarted;
    }
    Log(3, "\n\tIterate over all BSS list to find if any matches with any stored credential.");
    Log(3, "Enter findBestMatchBssAndCredential...");
    const NetworkChoice choice = findBestMatchBssAndCredential();
    if (choice.network == nullptr) {
        Log(3, "No matching network was found based on configured credentials.");
        return kConnectNothingLeft;
    }
    Log(3, "!!!Found a credential with id=%d for network with ssid=%s", choice.credential->m_id,
        choice.network->ssidText().c_str());
    const std::wstring name = wideFromNarrow(choice.network->ssid());
    const NetworkProfile* const profile = profileFor(choice, name);
    if (profile == nullptr) return kConnectFailed;
    if (m_engine.m_config.isAutoConnect()) {
        LogWide(3, L"Going to connect to network with ssid=%s", name.c_str());
        if (countAndConnect(choice, *profile) != kSuccess) {
            Log(6, "ERROR: Connect to network failed.");
            return kConnectFailed;
        }
    }
    return kConnectStarted;
}

}  // namespace vexa
