#include "base/DiagnosticLog.h"
#include "base/NetworkListLock.h"
#include "config/ResultCodes.h"
#include "connection/Supplicant.h"
#include "hotspotport/SAHotSpotPortlink.h"

namespace vexa {

// A connection hides what ANQP would answer, so it has to go first; the query follows when it has gone.
void SAHotSpotPortlink::updateNetworkRealm() {
    Log(3, "UI requested to update HS20 network realm.");
    const auto supplicant = hotspotSupplicant(*this);
    if (!m_bCardIn || !supplicant) return;
    const platform::LockGuard lock(g_hs20Lock);
    if (supplicant->queryState() != SupplicantState::Connected) {
        supplicant->queryHs20NetworkAnqpInfo();
        return;
    }
    Log(3, "Disconnecting from connecting/connected BSS...");
    Log(3, supplicant->getConnectedBss(true) != nullptr ? "Manually disconnect from a HS20 network."
                                                        : "Manually disconnect from a non-HS20 network.");
    supplicant->requestDisconnect();
    supplicant->m_bUserDisconnecting = true;
    m_bRealmUpdatePending = true;
}

// An SSID has 32 bytes at most; a longer name is refused like one that can't be joined.
void SAHotSpotPortlink::connectNetworkByName(const std::string& name) {
    const auto supplicant = hotspotSupplicant(*this);
    if (name.empty() || !supplicant) return;
    if (name.size() <= kMaxSsidLength && supplicant->connectBss(name) == kSuccess) return;
    Log(6, "connectBss failed.");
    SendConnectionResult(ConnectionResult{});
}

void SAHotSpotPortlink::disconnectNetworkByName(const std::string& name) {
    const auto supplicant = hotspotSupplicant(*this);
    if (name.empty() || !supplicant) return;
    const platform::LockGuard lock(g_hs20Lock);
    const Hs20Network* const connected = supplicant->getConnectedBss(true);
    if (connected == nullptr) return Log(6, "ERROR: Cannot get connected BSS.");
    if (connected->ssidText() != name)
        return Log(6, "ERROR: Connected ssid=%s while requesting disconnect from ssid=%s",
                   connected->ssidText().c_str(), name.c_str());
    if (supplicant->disconnectedBSS(true, true) != kSuccess) Log(6, "ERROR: disconnectedBSS call failed.");
}

}  // namespace vexa
