#include "simulation/modules/HotspotModule.h"

#include <algorithm>

namespace vexa::simulation {

using platform::LockGuard;
using platform::Mutex;

HotspotModule::HotspotModule(Airspace& airspace, platform::Duration anqpTime, Agenda& agenda,
                             NotificationQueue& notifications)
    : m_airspace(airspace), m_agenda(agenda), m_notifications(notifications), m_anqpTime(anqpTime) {}

DWORD HotspotModule::handle(const GUID& guid, IhvRequest kind, std::span<const std::uint8_t> request,
                            std::size_t capacity, Bytes& answer) {
    if (!isHotspotRequest(kind, request)) return ERROR_INVALID_PARAMETER;
    if (kind == IhvRequest::BssList) {
        answer = bssRecords(reportedNetworks());
        answer.resize(std::min(answer.size(), capacity / kBssRecordSize * kBssRecordSize));
    } else if (kind == IhvRequest::AnqpInfo) {
        const auto network = m_airspace.find(bssidOfRequest(request));
        if (network && network->reported && hasAnswered(*network)) answer = anqpInfo(*network);
    } else {
        startQuery(guid);
    }
    return ERROR_SUCCESS;
}

void HotspotModule::setAnqpTime(platform::Duration time) {
    const LockGuard<Mutex> lock(m_mutex);
    m_anqpTime = time;
}

Ticket HotspotModule::completeNextQuery(const GUID& guid) {
    {
        const LockGuard<Mutex> lock(m_mutex);
        if (!m_running.empty()) m_running.erase(m_running.begin());
    }
    return tellCompletion(guid);
}

Ticket HotspotModule::reportNetworks(const GUID& guid) {
    return post(guid, hotspotMessage(HotspotEvent::NetworkList, bssRecords(reportedNetworks())));
}

Ticket HotspotModule::reportAnqp(const GUID& guid, const Network& network) {
    return post(guid, hotspotMessage(HotspotEvent::AnqpInfo, bssRecord(network)),
                [this, bssid = network.bssid](Bytes&) { m_airspace.answerQuery(bssid); });
}

void HotspotModule::abandonQueries() {
    const LockGuard<Mutex> lock(m_mutex);
    m_running.clear();
}

std::vector<Airspace::Found> HotspotModule::reportedNetworks() const {
    auto networks = m_airspace.visible();
    std::erase_if(networks, [](const Airspace::Found& network) { return !network->reported; });
    return networks;
}

void HotspotModule::startQuery(const GUID& guid) {
    Query query;
    {
        const LockGuard<Mutex> lock(m_mutex);
        query = {platform::now() + m_anqpTime, ++m_started};
        m_running.insert(query);
    }
    m_agenda.add(query.first, [this, query, guid] { finishQuery(query, guid); });
}

void HotspotModule::finishQuery(const Query& query, const GUID& guid) {
    {
        const LockGuard<Mutex> lock(m_mutex);
        if (m_running.erase(query) == 0) return;
    }
    tellCompletion(guid);
}

Ticket HotspotModule::tellCompletion(const GUID& guid) {
    return post(guid, hotspotMessage(HotspotEvent::AnqpQueryCompleted),
                [this](Bytes&) { m_airspace.answerQueries(); });
}

Ticket HotspotModule::post(const GUID& guid, Bytes message, std::function<void(Bytes&)> before) {
    return m_notifications.post(
        {WLAN_NOTIFICATION_SOURCE_IHV, 0, guid, std::move(message), std::move(before)});
}

}  // namespace vexa::simulation
