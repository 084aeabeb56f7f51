#include "client/hotspot/Network.h"

#include <algorithm>
#include <array>
#include <utility>

#include "client/hotspot/Credential.h"
#include "client/port/JsonLine.h"
#include "client/terminal/Nearest.h"
#include "client/terminal/Text.h"

namespace vexa::client {

namespace {

using Internet = Network::Internet;

/// What the code of the service means, by whether the network is the connected one.
struct InternetCode {
    bool isConnected;
    int code;
    Internet meaning;
};
constexpr std::array kInternetCodes{InternetCode{true, 0, Internet::Reached},
                                    InternetCode{true, 1, Internet::Missing},
                                    InternetCode{false, 2, Internet::Offered}};

constexpr std::array kInternetNames{"none", "offered", "missing", "reached"};

Internet internetOf(bool isConnected, const Json::Value& code) {
    for (const auto& known : kInternetCodes) {
        if (code.isInt() && known.isConnected == isConnected && known.code == code.asInt())
            return known.meaning;
    }
    return Internet::None;
}

std::string internetName(Internet internet) {
    return kInternetNames[static_cast<std::size_t>(internet)];
}

std::string realmMethod(int method) {
    if (method == kMethodTls) return "TLS";
    if (method == kMethodTtls) return "TTLS";
    return std::to_string(method);
}

bool isTrue(const Json::Value& value) {
    return value.isBool() && value.asBool();
}

std::vector<Network::Realm> realmsOf(const Json::Value& value) {
    std::vector<Network::Realm> realms;
    if (!value.isArray()) return realms;
    for (const Json::Value& entry : value) {
        if (entry.isObject() && entry["RealmName"].isString() && entry["CredentialEapMethod"].isInt())
            realms.push_back({entry["CredentialEapMethod"].asInt(), entry["RealmName"].asString()});
    }
    return realms;
}

}  // namespace

NetworkList networkList(const Json::Value& payload) {
    NetworkList list;
    if (!payload.isArray()) return list;
    for (const Json::Value& entry : payload) {
        if (!entry.isObject() || !entry["NetWorkName"].isString()) continue;
        const bool isConnected = isTrue(entry["IsConnected"]);
        list.push_back({entry["NetWorkName"].asString(), isConnected,
                        internetOf(isConnected, entry["IsInternetAccess"]), isTrue(entry["RealmFetched"]),
                        realmsOf(entry["SupportRealmList"])});
    }
    return list;
}

const Network* connectedNetwork(const NetworkList& list) {
    const auto found =
        std::find_if(list.begin(), list.end(), [](const Network& network) { return network.isConnected; });
    return found == list.end() ? nullptr : &*found;
}

const Network* findNetwork(const NetworkList& list, const std::string& name) {
    const auto found =
        std::find_if(list.begin(), list.end(), [&](const Network& network) { return network.name == name; });
    return found == list.end() ? nullptr : &*found;
}

const Network* networkMeant(const NetworkList& list, const std::string& given) {
    if (const Network* const named = findNetwork(list, given)) return named;
    const auto found = std::find_if(list.begin(), list.end(),
                                    [&](const Network& network) { return printable(network.name) == given; });
    return found == list.end() ? nullptr : &*found;
}

std::string namesOf(const NetworkList& list) {
    std::string names;
    for (const Network& network : list)
        names += (names.empty() ? "" : ", ") + inQuotes(network.name);
    return names;
}

std::string namesLike(const NetworkList& list, const std::string& given) {
    std::vector<std::string> names;
    for (const Network& network : list)
        names.push_back(network.name);
    return namesLike(std::move(names), given);
}

std::string networkData(const std::string& name) {
    Json::Value data(Json::objectValue);
    data["NetWorkName"] = name;
    return jsonLine(data);
}

std::string realmsText(const Network& network) {
    if (!network.hasRealms) return "not known yet";
    std::string text;
    for (const auto& realm : network.realms)
        text += (text.empty() ? "" : ", ") + realm.name + " (" + realmMethod(realm.method) + ")";
    return text.empty() ? "none" : text;
}

std::vector<std::string> networkTable(const NetworkList& list) {
    std::vector<std::vector<std::string>> rows{{" ", "Network", "Connected", "Internet", "Realms"}};
    for (const auto& network : list)
        rows.push_back({network.isConnected ? "*" : "", network.name, network.isConnected ? "yes" : "no",
                        internetName(network.internet), realmsText(network)});
    return alignedLines(rows);
}

Json::Value networksJson(const NetworkList& list) {
    Json::Value array(Json::arrayValue);
    for (const auto& network : list) {
        Json::Value object(Json::objectValue);
        object["name"] = network.name;
        object["connected"] = network.isConnected;
        object["internet"] = internetName(network.internet);
        object["realms"] = network.hasRealms ? Json::Value(Json::arrayValue) : Json::Value();
        for (const auto& realm : network.realms) {
            Json::Value entry(Json::objectValue);
            entry["name"] = realm.name;
            entry["method"] = realmMethod(realm.method);
            object["realms"].append(entry);
        }
        array.append(object);
    }
    return array;
}

}  // namespace vexa::client
