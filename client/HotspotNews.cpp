#include "client/HotspotNews.h"

#include "client/ClientError.h"
#include "client/Event.h"
#include "client/HotspotQuestions.h"
#include "client/JsonLine.h"

namespace vexa::client {

namespace {

constexpr const char* kConnectionResult = "CONNECT_DISCONNECT";

std::string namesOf(const NetworkList& list) {
    std::string names;
    for (const Network& network : list) {
        if (!names.empty()) names += ", ";
        names += network.name;
        if (network.isConnected) names += " (connected)";
    }
    return names.empty() ? "none" : names;
}

}  // namespace

HotspotNews::HotspotNews(std::uint16_t port) : m_client(port) {
    m_client.send(commandText(kNetworkList));
}

std::vector<HotspotNews::Item> HotspotNews::process() {
    m_client.process();
    std::vector<Item> items;
    while (auto text = m_client.take()) {
        std::string sentence = sentenceFor(*text);
        items.push_back({std::move(*text), std::move(sentence)});
    }
    if (items.empty() && !m_client.isOpen()) throw ClientError("the service has closed the connection");
    return items;
}

// A result does not name its network; the list that is asked for then does.
std::string HotspotNews::sentenceFor(const std::string& text) {
    const auto event = parseEvent(text);
    if (!event) return {};
    const Json::Value payload = parseJson(event->data).value_or(Json::Value());
    if (event->id == kNetworkList) return networksChanged(networkList(payload));
    if (event->id != kConnectionResult) return {};
    m_client.send(commandText(kNetworkList));
    return payload == Json::Value(1) ? "joined a network" : "could not join a network";
}

std::string HotspotNews::networksChanged(NetworkList list) {
    if (list == m_networks) return {};
    m_networks = std::move(list);
    return "hotspots in range: " + namesOf(m_networks);
}

std::vector<std::string> HotspotNews::lines() const {
    if (m_networks.empty()) return {"No hotspots in range."};
    return networkTable(m_networks);
}

}  // namespace vexa::client
