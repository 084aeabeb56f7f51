#include "simulation/Machine.h"

#include <cassert>
#include <iostream>

#include "simulation/Queries.h"

namespace vexa::simulation {

namespace {

constexpr int kNoOverride = -1;

std::atomic<Machine*> currentMachine{nullptr};

Json::Value refusal(const std::string& error) {
    Json::Value answer;
    answer["ok"] = false;
    answer["error"] = error;
    return answer;
}

Ticket runAction(Machine& machine, const Json::Value& message, Asker asker) {
    const JsonPlace place(message, "");
    const Action& action = checkAction(place, machine.adapters().count());
    return action.run(machine, message, asker);
}

}  // namespace

Machine::Machine(Scenario scenario, std::filesystem::path folder)
    : m_scenario(std::move(scenario)),
      m_folder(std::move(folder)),
      m_start(platform::now()),
      m_adapters(m_scenario.adapters),
      m_airspace(m_scenario.networks),
      m_registry(m_scenario.registryClass, m_folder / "registry.json"),
      m_session(m_scenario.session),
      m_interfaceStateOverride(kNoOverride),
      m_spectral(m_scenario.spectrum, m_scenario.seed, m_agenda, m_notifications),
      m_hotspot(m_airspace, m_scenario.anqpTime, m_agenda, m_notifications),
      m_connections(m_adapters, m_airspace, m_scenario.connectTime, m_agenda, m_notifications) {
    [[maybe_unused]] Machine* const other = currentMachine.exchange(this);
    assert(!other);
    if (m_scenario.hotspotAutoConnect) m_registry.setAutoConnect(m_scenario.hotspotAutoConnect);
    beginTimeline();
}

Machine::~Machine() {
    stop();
    currentMachine = nullptr;
}

Machine* Machine::current() {
    return currentMachine;
}

Json::Value Machine::perform(const Json::Value& message) {
    if (!message.isObject()) return refusal("not an object");
    try {
        Json::Value answer;
        answer["ok"] = true;
        if (message.isMember("query") && !message.isMember("do")) {
            answer["result"] = runQuery(*this, message);
        } else {
            m_notifications.waitDelivered(runAction(*this, message, Asker::Client));
        }
        return answer;
    } catch (const JsonFault& fault) {
        return refusal(fault.what());
    }
}

void Machine::stop() {
    m_agenda.stop();
    m_notifications.stop();
}

WLAN_INTERFACE_STATE Machine::interfaceState(std::size_t adapter) const {
    const int state = m_interfaceStateOverride;
    if (state != kNoOverride) return static_cast<WLAN_INTERFACE_STATE>(state);
    return m_adapters.snapshot(adapter).inserted ? m_connections.shown(adapter).state
                                                 : wlan_interface_state_not_ready;
}

void Machine::overrideInterfaceState(std::optional<WLAN_INTERFACE_STATE> state) {
    m_interfaceStateOverride = state ? static_cast<int>(*state) : kNoOverride;
}

std::size_t Machine::usualAdapter() const {
    const auto index = m_adapters.usual();
    if (!index) throw JsonFault("adapter: the machine has none");
    return *index;
}

void Machine::beginTimeline() {
    for (const TimelineEntry& entry : m_scenario.timeline) {
        if (entry.at > platform::Duration::zero()) {
            m_agenda.add(m_start + entry.at, [this, &entry] { performEntry(entry.action); });
        } else {
            performEntry(entry.action);
        }
    }
    m_notifications.waitDelivered(m_notifications.post({}));
}

// Nobody waits for the answer; a line on standard error is all there is to tell.
void Machine::performEntry(const Json::Value& action) {
    try {
        runAction(*this, action, Asker::Timeline);
    } catch (const JsonFault& fault) {
        std::cerr << "timeline: " + std::string(fault.what()) + "\n";
    }
}

}  // namespace vexa::simulation
