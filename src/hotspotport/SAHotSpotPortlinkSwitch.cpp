#include "base/DiagnosticLog.h"
#include "base/NetworkListLock.h"
#include "channel/JsonText.h"
#include "connection/Supplicant.h"
#include "connection/SupplicantMgr.h"
#include "hotspotport/SAHotSpotPortlink.h"

namespace vexa {

void SAHotSpotPortlink::setHotSpotAutoConnect(bool enable) {
    const platform::LockGuard lock(g_hs20Lock);
    Log(3, "Set enable/disable HS20, param=%s", enable ? "true" : "false");
    const auto supplicant = hotspotSupplicant(*this);
    if (supplicant && supplicant->isHs20Enabled() != enable) switchHotspot(*supplicant, enable);
    SendData(toStyledText(Json::Value(enable)), "SET_HOTSPOT_AUTO_CONNECT");
}

void SAHotSpotPortlink::switchHotspot(Supplicant& supplicant, bool enable) {
    if (supplicant.m_pMgr != nullptr) {
        supplicant.m_lastHs20ToggleTime = getTimeValue();
        supplicant.m_pMgr->config().m_bHotSpotAutoConnect = enable;
        supplicant.m_retryHelper.resetAllNumRetries();
        supplicant.m_hEnableHs20Event.set();
        SendNetworkList(nullptr);
    }
    if (enable) return;
    Log(3,
        "STA is in connected state when user turns of HS20,trying to disconnect from any connected HS20 network.");
    if (supplicant.m_bHs20Connected) supplicant.disconnectedBSS(false, true);
}

}  // namespace vexa
