#pragma once

#include <atomic>
#include <filesystem>
#include <optional>

#include "platform/Clock.h"
#include "simulation/modules/HotspotModule.h"
#include "simulation/modules/SpectralModule.h"
#include "simulation/parts/Adapters.h"
#include "simulation/parts/Agenda.h"
#include "simulation/parts/Airspace.h"
#include "simulation/parts/CallLog.h"
#include "simulation/parts/Connections.h"
#include "simulation/parts/Faults.h"
#include "simulation/parts/Handles.h"
#include "simulation/parts/MachineRegistry.h"
#include "simulation/parts/NotificationQueue.h"
#include "simulation/scenario/Scenario.h"

namespace vexa::simulation {

/// The simulated machine. While one lives, the functions of platform/WlanApi.h work on it. Its parts can be
/// used from any thread, and no lock of theirs is held while a callback runs.
class Machine {
public:
    /// REQUIRES: no other machine lives.
    Machine(Scenario scenario, std::filesystem::path folder);
    ~Machine();
    Machine(const Machine&) = delete;
    Machine& operator=(const Machine&) = delete;

    /// The machine that lives, or null.
    static Machine* current();

    /// Ends timeline, scans, queries, connection attempts and notifications. Requests are still answered
    /// afterwards.
    void stop();

    platform::Duration start() const { return m_start; }
    platform::Duration elapsed() const { return platform::now() - m_start; }
    const std::filesystem::path& folder() const { return m_folder; }
    const Scenario& scenario() const { return m_scenario; }

    Adapters& adapters() { return m_adapters; }
    MachineRegistry& registry() { return m_registry; }
    Handles& handles() { return m_handles; }
    Faults& faults() { return m_faults; }
    CallLog& calls() { return m_calls; }
    NotificationQueue& notifications() { return m_notifications; }
    Agenda& agenda() { return m_agenda; }
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
