#include "engine/world/AirStory.h"

#include <cstdio>
#include <sstream>

namespace vexa::test {

namespace {

std::string bssid(int number) {
    char text[18];
    std::snprintf(text, sizeof text, "02:aa:00:00:%02x:%02x", number >> 8, number & 255);
    return text;
}

std::string behindComma(const std::string& members) {
    return (members.empty() ? "" : ",") + members;
}

std::string shown(const Json::Value& list) {
    if (list.isNull()) return "null";
    std::string text;
    for (const Json::Value& entry : list) {
        text += (text.empty() ? "" : " ") + entry["NetWorkName"].asString();
        if (entry["IsConnected"].asBool()) text += "*";
        if (!entry["RealmFetched"].asBool()) continue;
        std::string realms;
        for (const Json::Value& realm : entry["SupportRealmList"])
            realms += (realms.empty() ? "" : ",") + realm["RealmName"].asString() +
                      (realm["CredentialEapMethod"].asInt() == 1 ? " TLS" : " TTLS");
        text += "[" + realms + "]";
    }
    return text;
}

}  // namespace

std::string network(int number, const std::string& ssid, const std::string& members) {
    return R"({"bssid":")" + bssid(number) + R"(","ssid":")" + ssid + "\"" + behindComma(members) + "}";
}

std::string realms(const std::string& names, const std::string& methods) {
    return R"("realms":[{"names":[")" + names + R"("],"eapMethods":[)" + methods + "]}]";
}

std::string air(const std::vector<std::string>& networks, const std::string& members) {
    std::string text = R"({"networks":[)";
    for (const std::string& network : networks)
        text += (&network == networks.data() ? "" : ",") + network;
    return text + "]" + behindComma(members) + "}";
}

std::string on(const std::string& action, int number, const std::string& members) {
    return doing(action, R"("bssid":")" + bssid(number) + "\"" + behindComma(members));
}

std::string adding(const std::string& network) {
    return doing("addNetwork", R"("network":)" + network);
}

std::string moduleMessage(unsigned subtype, const Block& payload) {
    return moduleMessage(subtype, payload, static_cast<unsigned>(payload.size()));
}

std::string moduleMessage(unsigned subtype, const Block& payload, unsigned claimed) {
    Block header = bytesOfHex("005ec403 00000000 00000000 00000000");
    writeLittleEndian(std::span(header), 8, subtype);
    writeLittleEndian(std::span(header), 12, claimed);
    return doing("ihv", R"("dataHex":")" + hexOf(header + payload) + "\"");
}

std::string reply(const std::string& match, const Block& bytes) {
    return doing("reply", R"("match":")" + match + R"(","dataHex":")" + hexOf(bytes) + "\"");
}

std::string failing(const std::string& call, int error, const std::string& members) {
    return doing("fail",
                 R"("call":")" + call + R"(","error":)" + std::to_string(error) + behindComma(members));
}

std::string heard(World& world) {
    std::string text;
    for (const ClientEvent& event : world.hotspot().events()) {
        const bool isList = event.id == "GET_ALL_NETWORK_LIST";
        text += (text.empty() ? "" : "; ") + (isList ? "networks " + shown(event.data) : event.id);
    }
    return text;
}

std::string askedList(World& world) {
    world.order("GET_ALL_NETWORK_LIST");
    std::string last = "nothing";
    for (const ClientEvent& event : world.hotspot().events())
        if (event.id == "GET_ALL_NETWORK_LIST") last = shown(event.data);
    return last;
}

std::string rounds(World& world) {
    const std::string start = "#####Start new round of network connecting...#####";
    std::istringstream stream(world.messages());
    std::string rounds;
    for (std::string line; std::getline(stream, line);) {
        if (line == start)
            rounds += "\n";
        else
            rounds += (rounds.empty() || rounds.back() == '\n' ? "" : " | ") + line;
    }
    return rounds;
}

int count(std::string_view text, std::string_view part) {
    int found = 0;
    for (std::size_t at = text.find(part); at != text.npos; at = text.find(part, at + part.size()))
        ++found;
    return found;
}

void settle(World& world, platform::Duration span, const std::vector<std::string>& deeds) {
    world.advance(span);
    world.forget();
    world.play(deeds);
}

int moduleRequests(World& world, unsigned subtype) {
    int requests = 0;
    for (const Json::Value& call : world.perform(R"({"query":"calls"})")) {
        const Block in = bytesOfHex(call["inHex"].asString());
        if (in.size() >= 16 && readLittleEndian<unsigned>(in, 0) == 0x03C45E00 &&
            readLittleEndian<unsigned>(in, 8) == subtype)
            ++requests;
    }
    return requests;
}

}  // namespace vexa::test
