#include "client/record/AirHistory.h"

#include <algorithm>

#include "contract/Ports.h"

namespace vexa::client {

namespace {

using What = AirMoment::What;

ListedNetworks listOf(const Json::Value& payload) {
    std::map<std::string, Json::UInt> types;
    for (const Json::Value& entry : payload) {
        if (entry.isObject() && entry["NetWorkName"].isString() && entry["NetworkType"].isUInt())
            types[entry["NetWorkName"].asString()] = entry["NetworkType"].asUInt();
    }
    ListedNetworks list;
    for (Network& network : networkList(payload)) {
        const Json::UInt type = types[network.name];
        list.push_back({std::move(network), type});
    }
    return list;
}

}  // namespace

void AirHistory::take(const RecordedEvent& recorded) {
    const Event& event = recorded.event;
    const auto add = [&](What what) { m_moments.push_back({recorded.at, what}); };
    if (event.id == contract::kCardPlugIn) add(What::CardIn);
    if (event.id == contract::kCardPlugOut) add(What::CardOut);
    if (event.id == contract::kGetRadio)
        add(payloadOf(event) == Json::Value(true) ? What::RadioOn : What::RadioOff);
    if (event.id == contract::kSupplicantStateChange)
        m_moments.push_back({recorded.at, What::ModuleState, {}, payloadOf(event)});
    if (event.id == contract::kGetAllNetworkList) takeList(recorded.at, event);
    if (event.id == contract::kConnectDisconnect && payloadOf(event) == Json::Value(0)) ++m_failedAttempts;
    if (event.id == contract::kGetAllCredentialList)
        m_credentials = std::max<std::size_t>(m_credentials, payloadOf(event).size());
    if (event.id == contract::kCurrentChannelData) {
        const Json::Value channel = payloadOf(event);
        m_channel = channel.isInt() ? channel.asInt() : 0;
        noteChannel();
    }
}

void AirHistory::takeList(RecordedTime at, const Event& event) {
    m_moments.push_back({at, What::List, listOf(payloadOf(event))});
    m_connected.clear();
    auto behind = m_names.begin();
    for (const ListedNetwork& listed : m_moments.back().list) {
        const auto found = std::find(m_names.begin(), m_names.end(), listed.network.name);
        behind = (found == m_names.end() ? m_names.insert(behind, listed.network.name) : found) + 1;
        if (listed.network.isConnected) m_connected = listed.network.name;
    }
    noteChannel();
}

// The two halves tell it independently of each other; the first channel of a connection is its own.
void AirHistory::noteChannel() {
    if (!m_connected.empty() && m_channel != 0) m_channels.try_emplace(m_connected, m_channel);
}

int AirHistory::channelOf(const std::string& name) const {
    const auto found = m_channels.find(name);
    return found == m_channels.end() ? 0 : found->second;
}

}  // namespace vexa::client
