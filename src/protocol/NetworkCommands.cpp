#include "base/DiagnosticLog.h"
#include "base/NetworkListLock.h"
#include "connection/Supplicant.h"
#include "protocol/SAHotSpotPortlink.h"

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

}  // namespace vexa
