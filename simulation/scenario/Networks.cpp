#include "simulation/scenario/Networks.h"

#include <limits>

namespace vexa::simulation {

namespace {

constexpr std::size_t kMaxSsid = 32;
constexpr std::size_t kMaxByte = 255;
constexpr std::size_t kMaxRealms = 0xFFFF;
constexpr std::int64_t kEapTls = 13;
constexpr std::int64_t kEapTtls = 21;

std::string readText(const JsonPlace& place) {
    return place.text();
}

std::uint32_t readUnsigned(const JsonPlace& place) {
    return static_cast<std::uint32_t>(place.integer(0, std::numeric_limits<std::uint32_t>::max()));
}

std::uint8_t readByte(const JsonPlace& place) {
    return static_cast<std::uint8_t>(place.integer(0, 255));
}

constexpr JsonMember<NetworkRealm> kRealmMembers[] = {
    {"names", [](NetworkRealm& r, const JsonPlace& p) { r.names = readArray(p, readText); }},
    {"eapMethods", [](NetworkRealm& r, const JsonPlace& p) { r.eapMethods = readArray(p, readByte); }},
};

NetworkRealm readRealm(const JsonPlace& place) {
    NetworkRealm realm;
    readObject(place, kRealmMembers, realm);
    if (joinedNames(realm).size() > kMaxByte) place.member("names").fail("more than 255 bytes");
    if (realm.eapMethods.size() > kMaxByte) place.member("eapMethods").fail("more than 255 methods");
    return realm;
}

void readEapMethod(AcceptRule& rule, const JsonPlace& place) {
    const std::int64_t method = place.integer(0, 255);
    if (method != kEapTls && method != kEapTtls) place.fail("not one of 13, 21");
    rule.eapMethod = static_cast<int>(method);
}

constexpr JsonMember<AcceptRule> kAcceptMembers[] = {
    {"eapMethod", readEapMethod, Needed::Yes},
    {"username", [](AcceptRule& r, const JsonPlace& p) { r.username = p.text(); }},
    {"password", [](AcceptRule& r, const JsonPlace& p) { r.password = p.text(); }},
    {"authMode", [](AcceptRule& r, const JsonPlace& p) { r.authMode = p.text(); }},
    {"caCert", [](AcceptRule& r, const JsonPlace& p) { r.caCert = p.text(); }},
};

AcceptRule readAccept(const JsonPlace& place) {
    AcceptRule rule;
    readObject(place, kAcceptMembers, rule);
    return rule;
}

void setSsid(Network& network, Bytes ssid, const JsonPlace& place) {
    if (ssid.empty() || ssid.size() > kMaxSsid) place.fail("not 1 to 32 bytes");
    network.ssid = std::move(ssid);
}

void readSsid(Network& network, const JsonPlace& place) {
    const std::string text = place.text();
    setSsid(network, Bytes(text.begin(), text.end()), place);
}

void readRealms(Network& network, const JsonPlace& place) {
    network.realms = readArray(place, readRealm);
    if (network.realms->size() > kMaxRealms) place.fail("more than 65535 realms");
    network.naiRealmList.reset();
}

void readRealmList(Network& network, const JsonPlace& place) {
    network.naiRealmList = place.hex();
    network.realms.reset();
}

constexpr std::pair<std::string_view, AnqpAnswer> kAnqpAnswers[] = {
    {"ready", AnqpAnswer::Ready},
    {"onQuery", AnqpAnswer::OnQuery},
    {"never", AnqpAnswer::Never},
};

void readAnqp(Network& network, const JsonPlace& place) {
    network.anqp = readName(place, kAnqpAnswers);
    network.wasQueried = false;
}

constexpr JsonMember<Network> kNetworkMembers[] = {
    {"bssid", [](Network& n, const JsonPlace& p) { n.bssid = p.macAddress(); }},
    {"ssid", readSsid},
    {"ssidHex", [](Network& n, const JsonPlace& p) { setSsid(n, p.hex(), p); }},
    {"hs20", [](Network& n, const JsonPlace& p) { n.hs20 = p.flag(); }},
    {"networkType", [](Network& n, const JsonPlace& p) { n.networkType = readUnsigned(p); }},
    {"internetAccess", [](Network& n, const JsonPlace& p) { n.internetAccess = readUnsigned(p); }},
    {"channel", [](Network& n, const JsonPlace& p) { n.channel = readUnsigned(p); }},
    {"reported", [](Network& n, const JsonPlace& p) { n.reported = p.flag(); }},
    {"realms", readRealms},
    {"naiRealmHex", readRealmList},
    {"anqp", readAnqp},
    {"visible", [](Network& n, const JsonPlace& p) { n.visible = p.flag(); }},
    {"osProfile", [](Network& n, const JsonPlace& p) { n.osProfile = p.flag(); }},
    {"accepts", [](Network& n, const JsonPlace& p) { n.accepts = readArray(p, readAccept); }},
};

void refuseBoth(const JsonPlace& place, const char* first, const char* second) {
    if (place.value().isMember(first) && place.value().isMember(second)) {
        place.member(second).fail(std::string("not together with ") + first);
    }
}

}  // namespace

bool hasAnswered(const Network& network) {
    return network.anqp == AnqpAnswer::Ready || (network.anqp == AnqpAnswer::OnQuery && network.wasQueried);
}

std::string joinedNames(const NetworkRealm& realm) {
    std::string names;
    for (const std::string& name : realm.names)
        names += (&name == realm.names.data() ? "" : ";") + name;
    return names;
}

Network readNetwork(const JsonPlace& place) {
    Network network;
    changeNetwork(place, network);
    if (network.bssid.empty()) place.member("bssid").fail("missing");
    if (network.ssid.empty()) place.member("ssid").fail("missing");
    return network;
}

void changeNetwork(const JsonPlace& changes, Network& network) {
    readObject(changes, kNetworkMembers, network);
    refuseBoth(changes, "ssid", "ssidHex");
    refuseBoth(changes, "realms", "naiRealmHex");
}

}  // namespace vexa::simulation
