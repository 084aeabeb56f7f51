#include "engine/world/ConnectStory.h"

#include <regex>

namespace vexa::test {

namespace {

std::string firstMatch(const std::string& text, const char* pattern) {
    std::smatch match;
    return std::regex_search(text, match, std::regex(pattern)) ? match[1].str() : "?";
}

// By its hex: the name may be anything.
std::string ssidOf(const std::string& profile) {
    std::string ssid;
    for (const std::byte octet : bytesOfHex(firstMatch(profile, "<hex>([0-9a-f]*)</hex>")))
        ssid += std::to_integer<char>(octet);
    return ssid;
}

std::string shownProfile(const std::string& profile) {
    const std::string mode = firstMatch(profile, "<authMode>([A-Za-z]*)</authMode>");
    const std::string name = ssidOf(profile);
    const std::string domain = firstMatch(profile, "<domain>([^<]*)</domain>");
    if (profile.find(">21</Type>") != std::string::npos)
        return name + " ttls " + firstMatch(profile, "<username>([^<]*)</username>") +
               (domain.empty() ? "" : "@" + domain) + (mode == "machineOrUser" ? "" : " " + mode);
    return name + " tls " + firstMatch(profile, "<TrustedRootCA>([^<]*)</TrustedRootCA>") + " " + mode;
}

std::string shownConnect(const Json::Value& call) {
    std::string text;
    if (call["mode"].asInt() == 1 && call["ssid"].isNull())
        text = shownProfile(call["profile"].asString());
    else if (call["mode"].asInt() == 2 && call["profile"].isNull())
        text = "plain " + call["ssid"].asString();
    else
        text = "mode " + call["mode"].asString() + "?";
    return text + (call["flags"].asInt() == 1 ? "" : " flags " + call["flags"].asString());
}

std::string shownOutcome(const ClientEvent& event) {
    if (event.id == "CONNECT_DISCONNECT") return event.data.asString();
    if (event.id == "GET_IS_INTERNET_ACCESS") return event.data.asBool() ? "access" : "no access";
    if (event.id == "SET_HOTSPOT_AUTO_CONNECT") return "hs20 " + event.data.asString();
    return event.id == "GET_ALL_NETWORK_LIST" ? "networks" : "";
}

// Joined by blanks, the lists among them or not.
std::string outcomes(World& world, bool withLists) {
    std::string text;
    for (const ClientEvent& event : world.hotspot().events()) {
        const std::string outcome = shownOutcome(event);
        if (outcome.empty() || (outcome == "networks" && !withLists)) continue;
        text += (text.empty() ? "" : " ") + outcome;
    }
    return text;
}

int eapMethod(World& world) {
    const Json::Value registry = world.perform(R"({"query":"registry"})");
    return registry["HKEY_CURRENT_USER\\Software\\Korvane\\Vexa"].get("EapMethod", -1).asInt();
}

std::string nameData(const std::string& name) {
    Json::Value data;
    data["NetWorkName"] = name;
    return data.toStyledString();
}

}  // namespace

std::string ttls(const std::string& realm) {
    return realms(realm, "21");
}

std::string tls(const std::string& realm) {
    return realms(realm, "13");
}

std::string both(const std::string& realm) {
    return realms(realm, "13,21");
}

std::string lettingIn(const std::string& rules) {
    return R"("accepts":[)" + rules + "]";
}

std::string open(int number, const std::string& ssid, const std::string& realms) {
    return network(number, ssid, realms + "," + lettingIn(R"({"eapMethod":13},{"eapMethod":21})"));
}

void expectStanding(Story& story, const Standing& wanted) {
    if (wanted.requests) story.expect("requests", joined(requests(story)), *wanted.requests);
    if (wanted.results) story.expect("results", outcomes(story, false), *wanted.results);
    if (wanted.outcomes) story.expect("outcomes", outcomes(story, true), *wanted.outcomes);
    if (wanted.connected) story.expect("connected", connectedTo(story), *wanted.connected);
    if (wanted.eapMethod) story.expect("EAP method", eapMethod(story), *wanted.eapMethod);
}

std::vector<std::string> requests(World& world) {
    std::vector<std::string> requests;
    for (const Json::Value& call : world.perform(R"({"query":"calls"})")) {
        const std::string name = call["call"].asString();
        if (name != "WlanConnect" && name != "WlanDisconnect") continue;
        requests.push_back(name == "WlanConnect" ? shownConnect(call) : "disconnect");
        if (call["result"].asInt() != 0) requests.back() += " = " + call["result"].asString();
    }
    return requests;
}

std::string joined(const std::vector<std::string>& requests) {
    std::string text;
    for (const std::string& request : requests)
        text += (text.empty() ? "" : "; ") + request;
    return text;
}

std::string connectedTo(World& world) {
    const Json::Value state = world.perform(R"({"query":"interface"})");
    return state["state"] == "connected" ? state["ssid"].asString() : "-";
}

std::string connecting(const std::string& name) {
    return sending("CONNECT_NETWORK", nameData(name));
}

std::string disconnecting(const std::string& name) {
    return sending("DISCONNECT_NETWORK", nameData(name));
}

}  // namespace vexa::test
