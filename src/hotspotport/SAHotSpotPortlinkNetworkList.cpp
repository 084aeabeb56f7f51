#include <utility>
#include <vector>

#include "base/DiagnosticLog.h"
#include "base/NetworkListLock.h"
#include "channel/StyledText.h"
#include "connection/Supplicant.h"
#include "contract/Ports.h"
#include "hotspot/ShownName.h"
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

// What they take in the list, with names of usual length.
constexpr std::size_t kNetworkTextSize = 256;
constexpr std::size_t kRealmTextSize = 128;

// A list can have some 50,000 realms, each of which would be a dozen allocations as a Json::Value: it is
// written straight away, in the styled form.
void appendRealms(std::string& json, const Hs20Network& network) {
    const char* before = "[\n";
    for (const RealmInfo& realm : network.m_realms) {
        json += std::exchange(before, ",\n");
        json += "         {\n            \"CredentialEapMethod\" : ";
        json += std::to_string(realm.m_eapType);
        json += ",\n            \"RealmName\" : ";
        appendQuoted(json, realm.m_realm);
        json += "\n         }";
    }
    json += "\n      ]";
}

void appendNetwork(std::string& json, const Supplicant& supplicant, const Hs20Network& network,
                   bool isConnected) {
    const auto asText = [](bool flag) { return flag ? "true" : "false"; };
    json += "   {\n      \"IsConnected\" : ";
    json += asText(isConnected);
    json += ",\n      \"IsInternetAccess\" : ";
    json += std::to_string(internetAccessCode(supplicant, network, isConnected));
    json += ",\n      \"NetWorkName\" : ";
    appendQuoted(json, shownName(network.ssidText()));
    json += ",\n      \"NetworkType\" : ";
    json += std::to_string(network.m_networkType);
    json += ",\n      \"RealmFetched\" : ";
    json += asText(network.hasRealmData());
    if (network.hasRealmData() && !network.m_realms.empty()) {
        json += ",\n      \"SupportRealmList\" : ";
        appendRealms(json, network);
    }
    json += "\n   }";
}

std::size_t usualSize(const std::vector<Hs20Network*>& networks) {
    std::size_t size = 0;
    for (const Hs20Network* network : networks)
        size += kNetworkTextSize + network->m_realms.size() * kRealmTextSize;
    return size;
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
    std::string text;
    text.reserve(usualSize(listed->networks().copyPointers()));
    if (supplicant->isRadioOnCached() && isEnabled)
        for (const Hs20Network* network : listed->networks().copyPointers()) {
            text += text.empty() ? "[\n" : ",\n";
            appendNetwork(text, *supplicant, *network, network == connected);
        }
    text += text.empty() ? "null\n" : "\n]\n";
    Log(0, "GET_ALL_NETWORK_LIST=%s", text.c_str());
    SendData(text, contract::kGetAllNetworkList);
}

}  // namespace vexa
