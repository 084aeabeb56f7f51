#include "engine/AirStory.h"

#include <cctype>
#include <cstdio>
#include <sstream>

namespace vexa::test {

using namespace std::chrono_literals;

namespace {

bool hasPrefix(const std::string& line) {
    const std::size_t end = line.find("] ");
    return !line.empty() && line[0] == '[' && end != std::string::npos && line.size() >= end + 18 &&
           line[end + 4] == '/';
}

std::string withoutPrefix(const std::string& line) {
    return hasPrefix(line) ? line.substr(line.find("] ") + 18) : line;
}

}  // namespace

std::string bssid(int number) {
    char text[18];
    std::snprintf(text, sizeof text, "02:aa:00:00:%02x:%02x", number >> 8, number & 255);
    return text;
}

std::string network(int number, const std::string& ssid, const std::string& members) {
    return R"({"bssid":")" + bssid(number) + R"(","ssid":")" + ssid + "\"" + (members.empty() ? "" : ",") +
           members + "}";
}

std::string realms(const std::string& names, const std::string& methods) {
    return R"("realms":[{"names":[")" + names + R"("],"eapMethods":[)" + methods + "]}]";
}

std::string air(const std::vector<std::string>& networks, const std::string& members) {
    std::string text = R"({"networks":[)";
    for (const std::string& network : networks)
        text += (&network == networks.data() ? "" : ",") + network;
    return text + "]" + (members.empty() ? "" : ",") + members + "}";
}

std::string on(const std::string& action, int number, const std::string& members) {
    return R"({"do":")" + action + R"(","bssid":")" + bssid(number) + "\"" + (members.empty() ? "" : ",") +
           members + "}";
}

std::string moduleMessage(unsigned subtype, const Block& payload) {
    return moduleMessage(subtype, payload, static_cast<unsigned>(payload.size()));
}

std::string moduleMessage(unsigned subtype, const Block& payload, unsigned claimed) {
    Block header = bytesOfHex("005ec403 00000000 00000000 00000000");
    writeLittleEndian(std::span(header), 8, subtype);
    writeLittleEndian(std::span(header), 12, claimed);
    return R"({"do":"ihv","dataHex":")" + hexOf(header + payload) + "\"}";
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

std::string heard(World& world) {
    std::string text;
    for (const ClientEvent& event : world.hotspot().events()) {
        text += (text.empty() ? "" : "; ") + event.id;
        if (event.id == "GET_ALL_NETWORK_LIST") text += " " + shown(event.data);
    }
    return text;
}

std::string askedList(World& world) {
    world.hotspot().send("GET_ALL_NETWORK_LIST");
    world.advance(0ms);
    std::string last = "nothing";
    for (const ClientEvent& event : world.hotspot().events())
        if (event.id == "GET_ALL_NETWORK_LIST") last = shown(event.data);
    return last;
}

std::string messagesSince(World& world, std::size_t logSize) {
    std::istringstream stream(world.log().substr(logSize));
    std::string messages;
    for (std::string line; std::getline(stream, line);)
        if (const std::string message = withoutPrefix(line); !message.empty()) messages += message + "\n";
    return messages;
}

std::string roundsSince(World& world, std::size_t logSize) {
    const std::string start = "#####Start new round of network connecting...#####";
    std::istringstream stream(messagesSince(world, logSize));
    std::string rounds;
    for (std::string line; std::getline(stream, line);) {
        if (line == start)
            rounds += "\n";
        else
            rounds += (rounds.empty() || rounds.back() == '\n' ? "" : " | ") + line;
    }
    return rounds;
}

void settle(World& world) {
    world.advance(25s);
    world.spectral().events();
    world.hotspot().events();
}

int moduleRequests(World& world, unsigned subtype) {
    int requests = 0;
    for (const Json::Value& call : world.perform(R"({"query":"calls"})")) {
        if (call["call"].asString() != "WlanIhvControl") continue;
        const Block in = bytesOfHex(call["inHex"].asString());
        if (in.size() >= 16 && readLittleEndian<unsigned>(in, 0) == 0x03C45E00 &&
            readLittleEndian<unsigned>(in, 8) == subtype)
            ++requests;
    }
    return requests;
}

}  // namespace vexa::test
