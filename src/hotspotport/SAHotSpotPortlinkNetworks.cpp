#include "base/DiagnosticLog.h"
#include "base/NetworkListLock.h"
#include "channel/StyledText.h"
#include "config/ResultCodes.h"
#include "connection/Supplicant.h"
#include "contract/Ports.h"
#include "hotspotport/SAHotSpotPortlink.h"

namespace vexa {

namespace {

std::string ssidShownAs(const Supplicant& supplicant, const std::string& name) {
    const platform::LockGuard lock(g_hs20Lock);
    return supplicant.networks().ssidShownAs(name);
}

}  // namespace

void SAHotSpotPortlink::setHotSpotAutoConnect(bool enable) {
    const platform::LockGuard lock(g_hs20Lock);
    Log(3, "Set enable/disable HS20, param=%s", enable ? "true" : "false");
    const auto supplicant = hotspotSupplicant(*this);
    if (supplicant) supplicant->setHs20Enabled(enable);
    SendData(toStyledText(Json::Value(enable)), contract::kSetHotspotAutoConnect);
}

void SAHotSpotPortlink::updateNetworkRealm() {
    Log(3, "UI requested to update HS20 network realm.");
    const auto supplicant = hotspotSupplicant(*this);
    if (m_bCardIn && supplicant) supplicant->updateNetworkRealm();
}

// An SSID has 32 bytes at most; a longer name is refused like one that can't be joined.
void SAHotSpotPortlink::connectNetworkByName(const std::optional<std::string>& name) {
    const auto supplicant = hotspotSupplicant(*this);
    if ((name && name->empty()) || !supplicant) return;
    if (name) {
        const std::string ssid = ssidShownAs(*supplicant, *name);
        if (ssid.size() <= kMaxSsidLength && supplicant->connectBss(ssid) == kSuccess) return;
    }
    Log(6, "connectBss failed.");
    SendConnectionResult(ConnectionResult{});
}

void SAHotSpotPortlink::disconnectNetworkByName(const std::string& name) {
    const auto supplicant = hotspotSupplicant(*this);
    if (!name.empty() && supplicant) supplicant->disconnectBss(ssidShownAs(*supplicant, name));
}

}  // namespace vexa
