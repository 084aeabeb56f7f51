#include "simulation/scenario/Scenario.h"

#include <algorithm>
#include <limits>

#include "simulation/scenario/ActionForms.h"
#include "simulation/scenario/AdapterSetup.h"
#include "simulation/scenario/JsonText.h"

namespace vexa::simulation {

namespace {

constexpr double kMaxSpeed = 1e6;

void readSpeed(Scenario& scenario, const JsonPlace& place) {
    scenario.speed = place.number();
    if (scenario.speed < 0 || scenario.speed > kMaxSpeed) place.fail("not from 0 to 1000000");
}

void readSeed(Scenario& scenario, const JsonPlace& place) {
    scenario.seed = static_cast<std::uint64_t>(place.integer(0, std::numeric_limits<std::int64_t>::max()));
}

// The timeline is read last, when the number of adapters is known.
void leaveForLater(Scenario& /*scenario*/, const JsonPlace& /*place*/) {}

constexpr JsonMember<Scenario> kScenarioMembers[] = {
    {"speed", readSpeed},
    {"seed", readSeed},
    {"user", [](Scenario& s, const JsonPlace& p) { s.user = p.text(); }},
    {"session", [](Scenario& s, const JsonPlace& p) { s.session = readSessionState(p); }},
    {"hotspotAutoConnect", [](Scenario& s, const JsonPlace& p) { s.hotspotAutoConnect = p.text(); }},
    {"config", [](Scenario& s, const JsonPlace& p) { s.config = p.text(); }},
    {"adapters", [](Scenario& s, const JsonPlace& p) { s.adapters = readAdapters(p); }},
    {"registryClass", [](Scenario& s, const JsonPlace& p) { s.registryClass = readClassKey(p); }},
    {"networks", [](Scenario& s, const JsonPlace& p) { s.networks = readArray(p, readNetwork); }},
    {"connectMs", [](Scenario& s, const JsonPlace& p) { s.connectTime = p.milliseconds(); }},
    {"anqpMs", [](Scenario& s, const JsonPlace& p) { s.anqpTime = p.milliseconds(); }},
    {"spectrum", [](Scenario& s, const JsonPlace& p) { s.spectrum = readSpectrum(p); }},
    {"timeline", leaveForLater},
};

std::vector<TimelineEntry> readTimeline(const JsonPlace& place, std::size_t adapterCount) {
    auto timeline = readArray(place, [&](const JsonPlace& element) {
        TimelineEntry entry;
        entry.action = timelineAction(element, adapterCount, entry.at);
        return entry;
    });
    std::stable_sort(timeline.begin(), timeline.end(),
                     [](const TimelineEntry& a, const TimelineEntry& b) { return a.at < b.at; });
    return timeline;
}

}  // namespace

SessionState readSessionState(const JsonPlace& place) {
    static constexpr std::pair<std::string_view, SessionState> kStates[] = {
        {"active", SessionState::Active}, {"disconnected", SessionState::Disconnected}};
    return readName(place, kStates);
}

Scenario parseScenario(std::string_view text) {
    std::string error;
    const auto document = parseJson(text, error);
    if (!document) throw JsonFault("scenario: not JSON: " + error);
    const JsonPlace root(*document, "");
    Scenario scenario;
    scenario.adapters = {defaultAdapter(0)};
    readObject(root, kScenarioMembers, scenario);
    if (!document->isMember("registryClass")) scenario.registryClass = classKeyOf(scenario.adapters);
    if (document->isMember("timeline")) {
        scenario.timeline = readTimeline(root.member("timeline"), scenario.adapters.size());
    }
    return scenario;
}

}  // namespace vexa::simulation
