#include "client/record/AirScenario.h"

#include <algorithm>
#include <cstdio>

#include "client/hotspot/Credential.h"
#include "client/record/NetworkName.h"
#include "client/terminal/Text.h"

namespace vexa::client {

namespace {

using What = AirMoment::What;

// A connection that the machine makes takes as long.
constexpr RecordedTime kConnectTime{50};
// What the recorder asked at first is told until then.
constexpr RecordedTime kBeginning{1000};
constexpr int kEapTls = 13;
constexpr int kEapTtls = 21;
constexpr const char* kNameServer = "192.0.2.53";

std::string bssidOf(std::size_t index) {
    char text[32];
    std::snprintf(text, sizeof text, "02:00:00:00:%02x:%02x", static_cast<unsigned>(index >> 8U & 0xFFU),
                  static_cast<unsigned>(index & 0xFFU));
    return text;
}

// A list of realms that has none is not taken for one; an entry without a method is.
Json::Value realmsJson(const Network& network) {
    Json::Value realms(Json::arrayValue);
    const auto append = [&realms](const std::string& name) -> Json::Value& {
        Json::Value& realm = realms.append(Json::objectValue);
        realm["names"].append(name);
        return realm["eapMethods"] = Json::arrayValue;
    };
    for (const Network::Realm& realm : network.realms)
        append(realm.name).append(realm.method == kMethodTls ? kEapTls : kEapTtls);
    if (realms.empty()) append("");
    return realms;
}

/// The members of a network that a list tells.
Json::Value propertiesOf(const ListedNetwork& listed) {
    Json::Value properties(Json::objectValue);
    properties["networkType"] = listed.type;
    if (!listed.network.isConnected)
        properties["internetAccess"] = listed.network.internet == Network::Internet::Offered ? 1 : 0;
    properties["anqp"] = listed.network.hasRealms ? "ready" : "never";
    if (listed.network.hasRealms) properties["realms"] = realmsJson(listed.network);
    return properties;
}

Json::Value changesOf(const Json::Value& before, const Json::Value& now) {
    Json::Value changes(Json::objectValue);
    for (const std::string& name : now.getMemberNames()) {
        if (before[name] != now[name]) changes[name] = now[name];
    }
    return changes;
}

const ListedNetwork* find(const ListedNetworks& list, const std::string& name) {
    const auto found = std::find_if(list.begin(), list.end(),
                                    [&](const auto& listed) { return listed.network.name == name; });
    return found == list.end() ? nullptr : &*found;
}

const ListedNetwork* connectedOf(const ListedNetworks& list) {
    const auto found =
        std::find_if(list.begin(), list.end(), [](const auto& listed) { return listed.network.isConnected; });
    return found == list.end() ? nullptr : &*found;
}

}  // namespace

AirScenario::AirScenario(const AirHistory& history) : m_history(history) {
    for (const std::string& name : history.names()) {
        Place place{name, bssidOf(m_places.size() + 1), {}, false};
        for (const AirMoment& moment : history.moments()) {
            const ListedNetwork* const listed = find(moment.list, name);
            if (listed == nullptr) continue;
            place.properties = propertiesOf(*listed);
            break;
        }
        m_places.push_back(std::move(place));
    }
}

void AirScenario::write(Json::Value& scenario, ScenarioTimeline& timeline, ScenarioNotes& notes) {
    m_timeline = &timeline;
    scenario["connectMs"] = static_cast<Json::Int64>(kConnectTime.count());
    const std::size_t begun = writeBeginning(scenario);
    for (std::size_t i = begun; i < m_history.moments().size(); ++i)
        play(i);
    addNotes(notes);
}

// How things stood is what was told first. Gives the first moment that is none of this.
std::size_t AirScenario::writeBeginning(Json::Value& scenario) {
    const auto& moments = m_history.moments();
    const ListedNetworks* list = nullptr;
    std::size_t index = 0;
    for (; index < moments.size() && moments[index].at <= kBeginning && list == nullptr; ++index) {
        const What what = moments[index].what;
        if (what == What::CardIn || what == What::CardOut) m_isCardIn = what == What::CardIn;
        if (what == What::RadioOn || what == What::RadioOff) m_isRadioOn = what == What::RadioOn;
        if (what == What::List) list = &moments[index].list;
        if (what == What::ModuleState) play(index);
    }
    const ListedNetwork* const joined = list == nullptr ? nullptr : connectedOf(*list);
    m_hasInternet = joined == nullptr || joined->network.internet != Network::Internet::Missing;
    Json::Value& adapter = scenario["adapters"].append(Json::objectValue);
    if (!m_isCardIn) adapter["inserted"] = false;
    if (!m_isRadioOn) adapter["softwareRadio"] = "off";
    if (!m_hasInternet) adapter["dns"] = Json::arrayValue;
    scenario["networks"] = Json::arrayValue;
    for (Place& place : m_places) {
        place.isVisible = list != nullptr && find(*list, place.name) != nullptr;
        scenario["networks"].append(networkJson(place));
    }
    join(joined, {});
    return index;
}

Json::Value AirScenario::networkJson(const Place& place) const {
    Json::Value network = place.properties;
    network["bssid"] = place.bssid;
    network["visible"] = place.isVisible;
    const std::string ssid = ssidOfName(place.name);
    if (isTextSsid(ssid))
        network["ssid"] = ssid;
    else
        network["ssidHex"] = hexOf(ssid);
    if (const int channel = m_history.channelOf(place.name)) network["channel"] = channel;
    return network;
}

void AirScenario::play(std::size_t index) {
    const AirMoment& moment = m_history.moments()[index];
    switch (moment.what) {
        case What::List:
            return playList(moment);
        case What::CardIn:
            return insertCard(index);
        case What::CardOut:
            if (m_isCardIn) add(moment.at, "pullAdapter");
            m_isCardIn = false;
            m_connected.clear();
            return;
        case What::RadioOn:
        case What::RadioOff:
            if (m_isRadioOn != (moment.what == What::RadioOn)) radio(moment.at, m_isRadioOn = !m_isRadioOn);
            return;
        case What::ModuleState: {
            if (!moment.states["CurrentState"].isUInt() || !moment.states["PreviousState"].isUInt()) return;
            Json::Value& action = add(moment.at, "driverState");
            action["current"] = moment.states["CurrentState"];
            action["previous"] = moment.states["PreviousState"];
            return;
        }
    }
}

void AirScenario::playList(const AirMoment& moment) {
    const bool isEmpty = moment.list.empty();
    const bool isAnyVisible =
        std::any_of(m_places.begin(), m_places.end(), [](const Place& place) { return place.isVisible; });
    if (isEmpty && !isNothingTold() && isAnyVisible) {
        radio(moment.at, false);
        m_isMuted = m_wasMuted = true;
    }
    if (isEmpty || !m_isCardIn || !m_isRadioOn) return;
    if (m_isMuted) radio(moment.at, true);
    m_isMuted = false;
    const ListedNetwork* const joined = connectedOf(moment.list);
    const bool joins = joined != nullptr && joined->network.name != m_connected;
    const RecordedTime from = joins ? std::max(m_lastAction, moment.at - kConnectTime) : moment.at;
    if (joined == nullptr && !m_connected.empty()) add(moment.at, "dropConnection");
    if (joined == nullptr) m_connected.clear();
    // A network that is joined has to be in range by then.
    if (showOnly(from, moment.list)) add(from, "reportNetworks");
    join(joined, from);
}

// The service asks for the list at once, so what it will tell has to be there.
void AirScenario::insertCard(std::size_t index) {
    if (m_isCardIn) return;
    const RecordedTime at = m_history.moments()[index].at;
    if (const ListedNetworks* const list = listBehind(index)) showOnly(at, *list);
    add(at, "insertAdapter");
    m_isCardIn = true;
}

const ListedNetworks* AirScenario::listBehind(std::size_t index) const {
    const auto& moments = m_history.moments();
    for (++index; index < moments.size() && moments[index].what != What::CardOut; ++index) {
        if (moments[index].what == What::List) return &moments[index].list;
    }
    return nullptr;
}

/// True if something has changed.
bool AirScenario::showOnly(RecordedTime at, const ListedNetworks& list) {
    bool isChanged = false;
    for (Place& place : m_places) {
        const ListedNetwork* const listed = find(list, place.name);
        const Json::Value changes =
            listed == nullptr ? Json::Value() : changesOf(place.properties, propertiesOf(*listed));
        if (!changes.empty()) {
            Json::Value& action = add(at, "setNetwork");
            action["bssid"] = place.bssid;
            for (const std::string& name : changes.getMemberNames())
                place.properties[name] = action[name] = changes[name];
        }
        if (place.isVisible != (listed != nullptr)) add(at, listed ? "show" : "hide")["bssid"] = place.bssid;
        isChanged = isChanged || !changes.empty() || place.isVisible != (listed != nullptr);
        place.isVisible = listed != nullptr;
        if (listed == nullptr && m_connected == place.name) m_connected.clear();
    }
    return isChanged;
}

void AirScenario::join(const ListedNetwork* listed, RecordedTime from) {
    if (listed == nullptr) return;
    const bool hasInternet = listed->network.internet != Network::Internet::Missing;
    if (hasInternet != m_hasInternet) {
        Json::Value& dns = add(from, "setDns")["dns"] = Json::arrayValue;
        if (hasInternet) dns.append(kNameServer);
    }
    m_hasInternet = hasInternet;
    if (listed->network.name == m_connected) return;
    m_connected = listed->network.name;
    const std::string ssid = ssidOfName(m_connected);
    if (isTextSsid(ssid)) {
        add(from, "osConnect")["ssid"] = ssid;
        ++m_connections;
    } else {
        ++m_leftOut;
    }
}

void AirScenario::radio(RecordedTime at, bool isOn) {
    add(at, "radio")["software"] = isOn ? "on" : "off";
    if (!isOn) m_connected.clear();
}

Json::Value& AirScenario::add(RecordedTime at, const char* action) {
    m_lastAction = std::max(at, m_lastAction);
    return m_timeline->add(at, action);
}

void AirScenario::addNotes(ScenarioNotes& notes) const {
    if (!m_places.empty())
        notes.emplace_back("approximated: each network is one access point, with an address made up");
    const auto unknown = std::count_if(m_places.begin(), m_places.end(), [this](const Place& place) {
        return m_history.channelOf(place.name) == 0;
    });
    if (unknown > 0)
        notes.push_back("unknown: the channel of " + counted(static_cast<std::size_t>(unknown), "network") +
                        ", as it is only told of the connected one; the scenario takes 36");
    if (m_connections > 0)
        notes.push_back("approximated: " + counted(m_connections, "connection") +
                        " as one of the system's own, whichever credential was behind it");
    if (m_leftOut > 0)
        notes.push_back("left out: " + counted(m_leftOut, "connection") +
                        " to a network whose name is no UTF-8");
    if (m_wasMuted)
        notes.emplace_back(
            "approximated: the hotspot function was turned off; the scenario turns the radio off for as long");
    if (m_history.failedAttempts() > 0)
        notes.push_back("left out: " + counted(m_history.failedAttempts(), "failed attempt") + " to connect");
    if (m_history.credentials() > 0)
        notes.push_back("left out: " + counted(m_history.credentials(), "credential") +
                        "; with those the service would connect by itself");
}

}  // namespace vexa::client
