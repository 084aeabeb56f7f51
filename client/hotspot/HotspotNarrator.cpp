#include "client/hotspot/HotspotNarrator.h"

#include <json/value.h>

#include <algorithm>
#include <array>
#include <utility>

#include "client/hotspot/CredentialText.h"
#include "client/hotspot/Fitting.h"
#include "client/port/JsonLine.h"
#include "client/terminal/Text.h"
#include "contract/Ports.h"

namespace vexa::client {

namespace {

std::string connectedName(const NetworkList& list) {
    const Network* const network = connectedNetwork(list);
    return network == nullptr ? "" : network->name;
}

/// Said when a flag has another value than before.
std::vector<std::string> flagChange(std::optional<bool>& known, const Json::Value& payload, const char* yes,
                                    const char* no) {
    if (!payload.isBool() || known == payload.asBool()) return {};
    known = payload.asBool();
    return {*known ? yes : no};
}

}  // namespace

struct HotspotNarrator::Entry {
    const char* event;
    Teller teller;
};

const HotspotNarrator::Entry* HotspotNarrator::entryOf(const std::string& event) {
    static constexpr std::array kEntries{
        Entry{contract::kGetAllNetworkList, &HotspotNarrator::tellNetworks},
        Entry{contract::kGetAllCredentialList, &HotspotNarrator::tellCredentials},
        Entry{contract::kGetRadio, &HotspotNarrator::tellRadio},
        Entry{contract::kSetHotspotAutoConnect, &HotspotNarrator::tellSwitch},
        Entry{contract::kCardPlugIn, &HotspotNarrator::tellCardIn},
        Entry{contract::kCardPlugOut, &HotspotNarrator::tellCardOut},
        Entry{contract::kConnectDisconnect, &HotspotNarrator::tellResult},
        Entry{contract::kGetIsInternetAccess, &HotspotNarrator::tellInternet},
        Entry{contract::kDetectedHotspot, &HotspotNarrator::tellDetected},
        Entry{contract::kSupplicantStateChange, &HotspotNarrator::tellModuleState}};
    const auto found = std::find_if(kEntries.begin(), kEntries.end(),
                                    [&](const Entry& entry) { return event == entry.event; });
    return found == kEntries.end() ? nullptr : &*found;
}

std::vector<const char*> HotspotNarrator::firstQuestions() {
    return {contract::kGetIsCardIn, contract::kGetRadio, contract::kGetAllCredentialList,
            contract::kGetAllNetworkList, contract::kGetIsInternetAccess};
}

std::vector<std::string> HotspotNarrator::tell(const Event& event) {
    const Json::Value payload = payloadOf(event);
    if (const Entry* const entry = entryOf(event.id)) return (this->*entry->teller)(payload);
    return {printable(event.data.empty() ? event.id : event.id + " " + jsonLine(payload))};
}

std::vector<const char*> HotspotNarrator::takeQuestions() {
    return std::exchange(m_questions, {});
}

// A success does not name its network; the list that was asked for then does. A connection of the system's
// own is told as a success whatever came of it.
HotspotNarrator::Sentences HotspotNarrator::tellResult(const Json::Value& payload) {
    m_questions.push_back(contract::kGetAllNetworkList);
    if (payload != Json::Value(1)) return {"an attempt to connect has failed"};
    m_isResultOpen = true;
    return {};
}

HotspotNarrator::Sentences HotspotNarrator::tellNetworks(const Json::Value& payload) {
    const NetworkList before = std::exchange(m_networks, networkList(payload));
    const bool isResultOpen = std::exchange(m_isResultOpen, false);
    if (!std::exchange(m_hasNetworks, true)) return firstNetworks();
    Sentences told = newNetworks(before);
    const Network* const connected = connectedNetwork(m_networks);
    if (connected == nullptr && isResultOpen && connectedNetwork(before) == nullptr)
        told.emplace_back("the system has tried a connection of its own");
    if (connected != nullptr && connected->name != connectedName(before)) {
        m_joined.push_back(connected->name);
        told.push_back("joined " + withCredential(*connected));
    }
    return told;
}

HotspotNarrator::Sentences HotspotNarrator::firstNetworks() const {
    Sentences told{"hotspots in range: " + (m_networks.empty() ? "none" : namesOf(m_networks))};
    if (const Network* const connected = connectedNetwork(m_networks))
        told.push_back("connected to " + withCredential(*connected));
    return told;
}

HotspotNarrator::Sentences HotspotNarrator::newNetworks(const NetworkList& before) {
    Sentences told;
    const std::string connected = connectedName(before);
    if (!connected.empty() && connected != connectedName(m_networks))
        told.push_back("the connection to " + inQuotes(connected) + " has ended");
    for (const Network& network : before) {
        if (findNetwork(m_networks, network.name) == nullptr)
            told.push_back(inQuotes(network.name) + " is out of range");
    }
    for (const Network& network : m_networks) {
        const Network* const known = findNetwork(before, network.name);
        const std::string realms = printable(realmsText(network));
        if (known == nullptr)
            told.push_back(inQuotes(network.name) + " is in range; realms: " + realms);
        else if (realmsText(*known) != realmsText(network))
            told.push_back("realms of " + inQuotes(network.name) + ": " + realms);
    }
    return told;
}

std::string HotspotNarrator::withCredential(const Network& network) const {
    return inQuotes(network.name) + withOneOf(credentialsBehind(m_credentials, network, m_method()));
}

HotspotNarrator::Sentences HotspotNarrator::tellCredentials(const Json::Value& payload) {
    const CredentialList before = std::exchange(m_credentials, credentialList(payload));
    if (!std::exchange(m_hasCredentials, true))
        return {counted(m_credentials.size(), "credential") + " stored"};
    return credentialChanges(before, m_credentials);
}

HotspotNarrator::Sentences HotspotNarrator::tellRadio(const Json::Value& payload) {
    return flagChange(m_isRadioOn, payload, "the radio is on", "the radio is off");
}

HotspotNarrator::Sentences HotspotNarrator::tellSwitch(const Json::Value& payload) {
    return {payload == Json::Value(true) ? "hotspot networks are enabled" : "hotspot networks are disabled"};
}

// One that comes has networks and credentials to tell; all later lists come by themselves.
HotspotNarrator::Sentences HotspotNarrator::tellCardIn(const Json::Value& /*payload*/) {
    if (m_isCardIn == true) return {};
    if (m_isCardIn)
        m_questions.insert(m_questions.end(),
                           {contract::kGetAllCredentialList, contract::kGetAllNetworkList});
    return flagChange(m_isCardIn, true, "the adapter is in", "");
}

HotspotNarrator::Sentences HotspotNarrator::tellCardOut(const Json::Value& /*payload*/) {
    m_networks.clear();
    return flagChange(m_isCardIn, false, "", "the adapter is out");
}

HotspotNarrator::Sentences HotspotNarrator::tellInternet(const Json::Value& payload) {
    return flagChange(m_hasInternet, payload, "the internet is reached", "the internet is not reached");
}

HotspotNarrator::Sentences HotspotNarrator::tellDetected(const Json::Value& /*payload*/) {
    return {"new hotspots were detected"};
}

HotspotNarrator::Sentences HotspotNarrator::tellModuleState(const Json::Value& payload) {
    if (!payload.isObject()) return {};
    return {"the hotspot module went from state " + jsonLine(payload["PreviousState"]) + " to " +
            jsonLine(payload["CurrentState"])};
}

}  // namespace vexa::client
