#pragma once

#include <json/value.h>

#include <atomic>
#include <filesystem>
#include <optional>

#include "platform/Clock.h"
#include "simulation/ActionTable.h"
#include "simulation/Adapters.h"
#include "simulation/Agenda.h"
#include "simulation/Airspace.h"
#include "simulation/CallLog.h"
#include "simulation/Connections.h"
#include "simulation/Faults.h"
#include "simulation/Handles.h"
#include "simulation/HotspotModule.h"
#include "simulation/MachineRegistry.h"
#include "simulation/NotificationQueue.h"
#include "simulation/Scenario.h"
#include "simulation/SpectralModule.h"

namespace vexa::simulation {

/// The simulated machine. While one lives, the functions of platform/WlanApi.h work on it. Its parts can be
/// used from any thread, and no lock of theirs is held while a callback runs.
class Machine {
public:
    /// Begins the scenario's timeline: what is due at 0 has been done when this returns. REQUIRES: no other
    /// machine lives.
    Machine(Scenario scenario, std::filesystem::path folder);
    ~Machine();
    Machine(const Machine&) = delete;
    Machine& operator=(const Machine&) = delete;

    /// The machine that lives, or null.
    static Machine* current();

    /// Carries out an action or a query of the control channel and gives its answer. Returns when the
    /// action's own notifications have been delivered. Not to be called by a callback of this machine.
    Json::Value perform(const Json::Value& message);

    /// Ends timeline, scans, queries, connection attempts and notifications. Requests are still answered
    /// afterwards.
    void stop();

    platform::Duration elapsed() const { return platform::now() - m_start; }
    const std::filesystem::path& folder() const { return m_folder; }
    const Scenario& scenario() const { return m_scenario; }

    Adapters& adapters() { return m_adapters; }
    MachineRegistry& registry() { return m_registry; }
    Handles& handles() { return m_handles; }
    Faults& faults() { return m_faults; }
    CallLog& calls() { return m_calls; }
    NotificationQueue& notifications() { return m_notifications; }
    SpectralModule& spectral() { return m_spectral; }
    HotspotModule& hotspot() { return m_hotspot; }
    Airspace& airspace() { return m_airspace; }
    Connections& connections() { return m_connections; }

    SessionState session() const { return m_session; }
    void setSession(SessionState session) { m_session = session; }

    /// What queries answer as the state of an interface.
    WLAN_INTERFACE_STATE interfaceState(std::size_t adapter) const;
    void overrideInterfaceState(std::optional<WLAN_INTERFACE_STATE> state);

    /// The adapter that actions mean which name none. Throws JsonFault if the machine has none.
    std::size_t usualAdapter() const;

private:
    void beginTimeline();
    void performEntry(const Json::Value& action);

    const Scenario m_scenario;
    const std::filesystem::path m_folder;
    const platform::Duration m_start;
    Adapters m_adapters;
    Airspace m_airspace;
    MachineRegistry m_registry;
    Handles m_handles;
    Faults m_faults;
    CallLog m_calls;
    std::atomic<SessionState> m_session;
    std::atomic<int> m_interfaceStateOverride;
    NotificationQueue m_notifications;
    Agenda m_agenda;
    SpectralModule m_spectral;
    HotspotModule m_hotspot;
    Connections m_connections;
};

}  // namespace vexa::simulation
