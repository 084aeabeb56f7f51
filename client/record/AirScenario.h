#pragma once

#include <json/value.h>

#include <string>
#include <vector>

#include "client/record/AirHistory.h"
#include "client/record/ScenarioTimeline.h"

namespace vexa::client {

/// Makes networks and actions of a scenario of what a recording tells of the air and the adapter. It goes
/// along with what the simulated machine has in range and is connected to, and adds what has to happen there
/// so that the service tells the same lists.
class AirScenario {
public:
    explicit AirScenario(const AirHistory& history);

    /// Adds members to the scenario, and says what in them is made up.
    void write(Json::Value& scenario, ScenarioTimeline& timeline, ScenarioNotes& notes);

private:
    struct Place {
        std::string name;
        std::string bssid;
        Json::Value properties;  ///< Members of the network as the machine has them now.
        bool isVisible = false;
    };

    std::size_t writeBeginning(Json::Value& scenario);
    Json::Value networkJson(const Place& place) const;
    void play(std::size_t index);
    void playList(const AirMoment& moment);
    void insertCard(std::size_t index);
    bool showOnly(RecordedTime at, const ListedNetworks& list);
    void join(const ListedNetwork* listed, RecordedTime from);
    void radio(RecordedTime at, bool isOn);
    void addNotes(ScenarioNotes& notes) const;

    const ListedNetworks* listBehind(std::size_t index) const;
    Json::Value& add(RecordedTime at, const char* action);
    bool isNothingTold() const { return !m_isCardIn || !m_isRadioOn || m_isMuted; }

    const AirHistory& m_history;
    ScenarioTimeline* m_timeline = nullptr;
    std::vector<Place> m_places;
    std::string m_connected;
    RecordedTime m_lastAction{};
    bool m_isCardIn = true;
    bool m_isRadioOn = true;
    /// A list was empty although nothing was off: so the hotspot function was. In its place the radio is
    /// turned off, as no action of a scenario can do that.
    bool m_isMuted = false;
    bool m_wasMuted = false;
    bool m_hasInternet = true;
    std::size_t m_connections = 0;
    std::size_t m_leftOut = 0;
};

}  // namespace vexa::client
