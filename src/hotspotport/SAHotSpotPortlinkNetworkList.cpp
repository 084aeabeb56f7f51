#include <utility>
#include <vector>

#include "base/DiagnosticLog.h"
#include "base/NetworkListLock.h"
#include "channel/Envelope.h"
#include "channel/StyledText.h"
#include "connection/Supplicant.h"
#include "contract/Ports.h"
#include "hotspot/ShownName.h"
#include "hotspotport/ListText.h"
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

// What they take in the event, with names of usual length.
constexpr std::size_t kNetworkTextSize = 320;
constexpr std::size_t kRealmTextSize = 160;

// A list can have some 50,000 realms.
void appendRealms(std::string& event, const Hs20Network& network) {
    const char* before = R"([\n)";
    for (const RealmInfo& realm : network.m_realms) {
        event += std::exchange(before, R"(,\n)");
        event += R"(         {\n            \"CredentialEapMethod\" : )";
        event += std::to_string(realm.m_eapType);
        event += R"(,\n            \"RealmName\" : )";
        appendQuotedTwice(event, realm.m_realm);
        event += R"(\n         })";
    }
    event += R"(\n      ])";
}

void appendNetwork(std::string& event, const Supplicant& supplicant, const Hs20Network& network,
                   bool isConnected) {
    ObjectText object(event);
    object.member("IsConnected", isConnected);
    object.member("IsInternetAccess", internetAccessCode(supplicant, network, isConnected));
    object.member("NetWorkName", shownName(network.ssidText()));
    object.member("NetworkType", network.m_networkType);
    object.member("RealmFetched", network.hasRealmData());
    if (network.hasRealmData() && !network.m_realms.empty())
        appendRealms(object.begin("SupportRealmList"), network);
    object.end();
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
    std::vector<Hs20Network*> shown;
    if (supplicant->isRadioOnCached() && isEnabled) shown = listed->networks().copyPointers();
    const std::string event = buildEnvelope(
        contract::kGetAllNetworkList, contract::kHotspotSource, usualSize(shown), [&](std::string& text) {
            appendListText(text, shown, [&](const Hs20Network& network) {
                appendNetwork(text, *supplicant, network, &network == connected);
            });
        });
    Log(0, "GET_ALL_NETWORK_LIST=%s", event.c_str());
    SendEvent(event);
}

}  // namespace vexa
