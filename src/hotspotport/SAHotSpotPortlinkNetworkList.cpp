#include "base/DiagnosticLog.h"
#include "base/NetworkListLock.h"
#include "channel/StyledText.h"
#include "connection/Supplicant.h"
#include "contract/Ports.h"
#include "hotspotport/SAHotSpotPortlink.h"

namespace vexa {

namespace {

// What the client reads in `IsInternetAccess`.
constexpr int kNoWarning = 0;
constexpr int kConnectedWithoutAccess = 1;
constexpr int kAccessOffered = 2;

int internetAccessCode(const Supplicant& supplicant, const Hs20Network& network, bool isConnected) {
    if (!isConnected) return network.m_internetAccess != 0 ? kAccessOffered : kNoWarning;
    return supplicant.hasInternetAccess() ? kNoWarning : kConnectedWithoutAccess;
}

Json::Value realmsAsJson(const Hs20Network& network) {
    Json::Value realms(Json::arrayValue);
    for (const RealmInfo& realm : network.m_realms) {
        if (realm.m_eapType != kEapMethodTls && realm.m_eapType != kEapMethodTtls) {
            Log(6, "ERROR: Invalid EAP type.");
            continue;
        }
        Json::Value& entry = realms.append(Json::Value(Json::objectValue));
        entry["CredentialEapMethod"] = realm.m_eapType;
        entry["RealmName"] = realm.m_realm;
    }
    return realms;
}

Json::Value networkAsJson(const Supplicant& supplicant, const Hs20Network& network, bool isConnected) {
    Json::Value object;
    object["NetWorkName"] = network.ssidText();
    object["NetworkType"] = network.m_networkType;
    object["IsConnected"] = isConnected;
    object["IsInternetAccess"] = internetAccessCode(supplicant, network, isConnected);
    object["RealmFetched"] = network.hasRealmData();
    if (network.hasRealmData() && !network.m_realms.empty())
        object["SupportRealmList"] = realmsAsJson(network);
    return object;
}

}  // namespace

void SAHotSpotPortlink::SendNetworkList(Supplicant* supplicant) {
    const platform::LockGuard lock(g_hs20Lock);
    Log(3, "Send all HS20 networks to vexa.");
    const auto listed = hotspotSupplicant(*this);
    if (supplicant == nullptr) supplicant = listed.get();
    if (supplicant == nullptr) return Log(6, "ERROR: No supplicant.");
    if (!supplicant->isRadioOnCached()) Log(3, "Radio is turned off, will send null network list.");
    const bool isEnabled = supplicant->isHs20Enabled();
    const Hs20Network* const connected = supplicant->getConnectedBss(false);
    if (!listed) return;
    Json::Value networks;
    if (supplicant->isRadioOnCached() && isEnabled)
        for (const Hs20Network* network : listed->networks().copyPointers())
            networks.append(networkAsJson(*supplicant, *network, network == connected));
    const std::string text = toStyledText(networks);
    Log(0, "GET_ALL_NETWORK_LIST=%s", text.c_str());
    SendData(text, contract::kGetAllNetworkList);
}

}  // namespace vexa
