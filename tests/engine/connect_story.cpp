#include "engine/connect_story.h"

#include <json/writer.h>

#include <map>
#include <regex>
#include <sstream>

namespace vexa::test {

using namespace std::chrono_literals;

namespace {

std::string element(const std::string& name, const std::string& text) {
    return "<" + name + ">" + text + "</" + name + ">";
}

std::string flag(bool value) {
    return value ? "true" : "false";
}

std::string withId(const std::string& text, const char* letter, int id) {
    return text.empty() ? letter + std::to_string(id) : text;
}

std::string stored(const StoredCredential& credential) {
    const std::string secrets =
        credential.isTls
            ? element("cacert", "ca" + std::to_string(credential.id)) + element("clientcert", "cc")
            : element("username", withId(credential.user, "u", credential.id)) +
                  element("password", withId(credential.password, "p", credential.id));
    return element("credential", element("id", std::to_string(credential.id)) +
                                     element("type", credential.isTls ? "eaptls" : "eapttls") +
                                     element("accesstype", "alluser") +
                                     element("creator", "KORVANE-PC\\user") +
                                     element("eap", credential.isTls ? "1" : "2") +
                                     element("autoconnect", flag(credential.autoConnect)) +
                                     element("credname", "name" + std::to_string(credential.id)) +
                                     element("realm", credential.realm) + secrets);
}

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
    if (profile.find(">21</Type>") != std::string::npos)
        return name + " ttls " + firstMatch(profile, "<username>([^<]*)</username>") +
               (mode == "machineOrUser" ? "" : " " + mode);
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

void order(World& world, const std::string& command, const std::string& name) {
    Json::Value data;
    data["NetWorkName"] = name;
    world.hotspot().send(command, data.toStyledString());
    world.advance(0ms);
}

}  // namespace

std::string storeText(const std::vector<StoredCredential>& credentials, const StoreOptions& options) {
    std::string all;
    std::string references;
    int place = 0;
    int next = 1;
    for (const StoredCredential& credential : credentials) {
        ++place;
        next = std::max(next, credential.id + 1);
        all += stored(credential);
        references += element(
            "credential",
            element("id", std::to_string(credential.id)) +
                element("priority", std::to_string(credential.priority != 0 ? credential.priority : place)));
    }
    const std::string global =
        element("dump_file_path", "hs20log.txt") + element("create_new_dump_file", "false") +
        element("autoconnect", flag(options.autoConnect)) + element("enabledump", flag(options.log)) +
        element("dumplevel", "0") + element("homerealm", options.homeRealm) +
        element("nextcredid", std::to_string(next));
    const std::string user = element("username", "KORVANE-PC\\user") + element("credentials", references);
    return R"(<?xml version="1.0" encoding="UTF-8"?>)" +
           element("configurations", element("global", global) + element("credentials", all) +
                                         element("users", element("user", user)));
}

std::string storing(const std::vector<StoredCredential>& credentials, const StoreOptions& options) {
    return "\"config\":" + Json::valueToQuotedString(storeText(credentials, options).c_str());
}

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

std::string lettingInAll() {
    return lettingIn(R"({"eapMethod":13},{"eapMethod":21})");
}

std::string requests(World& world) {
    std::string text;
    for (const Json::Value& call : world.perform(R"({"query":"calls"})")) {
        const std::string name = call["call"].asString();
        if (name != "WlanConnect" && name != "WlanDisconnect") continue;
        text += name == "WlanConnect" ? shownConnect(call) : "disconnect";
        if (call["result"].asInt() != 0) text += " = " + call["result"].asString();
        text += "\n";
    }
    return text;
}

std::string outcomes(World& world) {
    std::string text;
    for (const ClientEvent& event : world.hotspot().events())
        if (const std::string outcome = shownOutcome(event); !outcome.empty())
            text += (text.empty() ? "" : " ") + outcome;
    return text;
}

std::string results(World& world) {
    std::string text = std::regex_replace(outcomes(world), std::regex("networks ?"), "");
    if (text.ends_with(' ')) text.pop_back();
    return text;
}

int eapMethod(World& world) {
    const Json::Value registry = world.perform(R"({"query":"registry"})");
    return registry["HKEY_CURRENT_USER\\Software\\Korvane\\Vexa"].get("EapMethod", -1).asInt();
}

std::string connectedTo(World& world) {
    const Json::Value state = world.perform(R"({"query":"interface"})");
    return state["state"] == "connected" ? state["ssid"].asString() : "-";
}

std::string missingInOrder(World& world, const std::vector<std::string>& lines, std::size_t logSize) {
    const std::string log = "\n" + messagesSince(world, logSize);
    std::size_t at = 0;
    for (const std::string& line : lines) {
        const std::size_t found = log.find("\n" + line + "\n", at);
        if (found == std::string::npos) return "missing: " + line + "\nin: " + log.substr(at);
        at = found + line.size() + 1;
    }
    return "";
}

void connect(World& world, const std::string& name) {
    order(world, "CONNECT_NETWORK", name);
}

void disconnect(World& world, const std::string& name) {
    order(world, "DISCONNECT_NETWORK", name);
}

void switchHs20(World& world, bool on) {
    world.hotspot().send("SET_HOTSPOT_AUTO_CONNECT", on ? "true" : "false");
    world.advance(0ms);
}

}  // namespace vexa::test
