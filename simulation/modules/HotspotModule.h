#pragma once

#include <cstdint>
#include <functional>
#include <set>
#include <span>
#include <utility>
#include <vector>

#include "platform/Mutex.h"
#include "platform/WlanApi.h"
#include "simulation/modules/HotspotMessages.h"
#include "simulation/parts/Agenda.h"
#include "simulation/parts/Airspace.h"
#include "simulation/parts/NotificationQueue.h"

namespace vexa::simulation {

/// The hotspot half of the adapter: tells which networks it sees, asks them by ANQP, and keeps what they
/// answered. Any thread.
class HotspotModule {
public:
    HotspotModule(Airspace& airspace, platform::Duration anqpTime, Agenda& agenda,
                  NotificationQueue& notifications);

    /// Carries out a BssList, AnqpInfo or AnqpQuery request of a caller with room for `capacity` bytes;
    /// `answer` gets what is to be returned, which may be more.
    DWORD handle(const GUID& guid, IhvRequest kind, std::span<const std::uint8_t> request,
                 std::size_t capacity, Bytes& answer);

    /// How long a query takes, from now on.
    void setAnqpTime(platform::Duration time);

    /// Completes the query that is due next, now. Without one the completion is told all the same.
    Ticket completeNextQuery(const GUID& guid);

    Ticket reportNetworks(const GUID& guid);

    /// The network's answer has come, whether it was asked or not.
    Ticket reportAnqp(const GUID& guid, const Network& network);

    /// No query that runs is completed any more.
    void abandonQueries();

private:
    using Query = std::pair<platform::Duration, std::uint64_t>;  // when it is due, and its number

    std::vector<Airspace::Found> reportedNetworks() const;
    void startQuery(const GUID& guid);
    void finishQuery(const Query& query, const GUID& guid);
    Ticket tellCompletion(const GUID& guid);
    Ticket post(const GUID& guid, Bytes message, std::function<void(Bytes&)> before = nullptr);

    Airspace& m_airspace;
    Agenda& m_agenda;
    NotificationQueue& m_notifications;
    platform::Mutex m_mutex{"the hotspot module"};
    platform::Duration m_anqpTime GUARDED_BY(m_mutex);
    std::set<Query> m_running GUARDED_BY(m_mutex);
    std::uint64_t m_started GUARDED_BY(m_mutex) = 0;
};

}  // namespace vexa::simulation
