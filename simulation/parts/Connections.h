#pragma once

#include <functional>
#include <optional>
#include <string>
#include <vector>

#include "platform/Mutex.h"
#include "simulation/parts/Adapters.h"
#include "simulation/parts/Agenda.h"
#include "simulation/parts/Airspace.h"
#include "simulation/parts/ConnectionSteps.h"
#include "simulation/parts/Link.h"
#include "simulation/parts/NotificationQueue.h"
#include "simulation/parts/WlanProfile.h"

namespace vexa::simulation {

/// A connection that is wanted, and what decides about it: the profile, or the system's own profile of the
/// network if there is none; or, for what the system does by itself, what is known beforehand.
struct ConnectionWish {
    WLAN_CONNECTION_MODE mode = wlan_connection_mode_invalid;
    std::u16string profileName;
    Bytes ssid;
    std::optional<WlanProfile> profile = std::nullopt;
    std::optional<bool> succeeds = std::nullopt;
};

/// The wish for the network of a profile.
ConnectionWish wishFor(WlanProfile profile);

/// The wish for a network by its name, which names the profile too.
ConnectionWish wishFor(WLAN_CONNECTION_MODE mode, const Bytes& ssid);

/// The machine's one connection, and what ends it: requests, the radio, the adapter. What is decided shows
/// when its notification comes; so a handler finds what it has just been told of. Any thread.
class Connections {
public:
    Connections(Adapters& adapters, Airspace& airspace, platform::Duration connectTime, Agenda& agenda,
                NotificationQueue& notifications);

    /// From a request to its result, from now on.
    void setConnectTime(platform::Duration time);

    /// Begins an attempt, in place of what there is. Error codes of WlanConnect.
    DWORD connect(std::size_t adapter, ConnectionWish wish);

    /// Begins one that the service wasn't asked for. Nothing happens where the adapter can't.
    Ticket connectBySystem(std::size_t adapter, ConnectionWish wish);

    void disconnect(std::size_t adapter);

    // Each gives the ticket of its last notification, 0 if there is none.
    Ticket drop(DWORD reason);
    Ticket dropFrom(std::span<const std::uint8_t> bssid);
    Ticket changeRadio(std::size_t adapter, std::optional<DOT11_RADIO_STATE> hardware,
                       std::optional<DOT11_RADIO_STATE> software);
    Ticket insert(std::size_t adapter);

    /// `atRemoval` is called when the adapter goes.
    Ticket pull(std::size_t adapter, std::function<void()> atRemoval);

    /// What queries about the adapter answer.
    Link shown(std::size_t adapter) const;

private:
    /// What has been decided about an adapter. Its notification may still be on its way.
    struct Decided {
        bool isInserted;
        RadioState radio;
    };

    DWORD check(std::size_t adapter) const REQUIRES(m_mutex);
    Ticket begin(std::size_t adapter, ConnectionWish wish, const ConnectionCourse& course) REQUIRES(m_mutex);
    void finish(std::uint64_t attempt);
    DWORD judge(const Network* network) const REQUIRES(m_mutex);
    Ticket end(ConnectionSteps ofConnection, DWORD reason, ConnectionSteps ofAttempt) REQUIRES(m_mutex);
    Ticket lose(std::size_t adapter) REQUIRES(m_mutex);
    Ticket take(ConnectionSteps steps, DWORD reason) REQUIRES(m_mutex);
    Ticket take(const ConnectionStep& step, DWORD reason) REQUIRES(m_mutex);
    Ticket postPresence(std::size_t adapter, DWORD code, std::function<void(Bytes&)> before)
        REQUIRES(m_mutex);
    void show(const Link& link);

    Adapters& m_adapters;
    Airspace& m_airspace;
    Agenda& m_agenda;
    NotificationQueue& m_notifications;
    mutable platform::Mutex m_mutex{"the connection"};
    platform::Duration m_connectTime GUARDED_BY(m_mutex);
    std::vector<Decided> m_decided GUARDED_BY(m_mutex);
    Link m_link GUARDED_BY(m_mutex);   // as decided: disconnected, associating or connected
    Link m_shown GUARDED_BY(m_mutex);  // as told
    std::size_t m_untold GUARDED_BY(m_mutex) = 0;
    ConnectionWish m_wish GUARDED_BY(m_mutex);
    const ConnectionCourse* m_course GUARDED_BY(m_mutex) = &kAskedFor;
    std::uint64_t m_attempts GUARDED_BY(m_mutex) = 0;
};

}  // namespace vexa::simulation
