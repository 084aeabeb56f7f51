#include "simulation/Machine.h"

#include <cassert>

namespace vexa::simulation {

namespace {

constexpr int kNoOverride = -1;

std::atomic<Machine*> currentMachine{nullptr};

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
}

Machine::~Machine() {
    stop();
    currentMachine = nullptr;
}

Machine* Machine::current() {
    return currentMachine;
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

}  // namespace vexa::simulation
