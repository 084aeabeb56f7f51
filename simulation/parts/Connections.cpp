#include "simulation/parts/Connections.h"

#include <algorithm>

#include "simulation/parts/ReasonTexts.h"
#include "simulation/text/Wire.h"

namespace vexa::simulation {

using platform::LockGuard;
using platform::Mutex;

namespace {

constexpr DWORD kArrival = 13;
constexpr DWORD kRemoval = 14;
constexpr DWORD kRadioStateChange = 7;

bool isOff(const RadioState& radio) {
    return radio.hardware == dot11_radio_state_off || radio.software == dot11_radio_state_off;
}

}  // namespace

ConnectionWish wishFor(WlanProfile profile) {
    return {wlan_connection_mode_temporary_profile, utf16(profile.name), profile.ssid, std::move(profile)};
}

ConnectionWish wishFor(WLAN_CONNECTION_MODE mode, const Bytes& ssid) {
    return {mode, std::u16string(ssid.begin(), ssid.end()), ssid};
}

Connections::Connections(Adapters& adapters, Airspace& airspace, platform::Duration connectTime,
                         Agenda& agenda, NotificationQueue& notifications)
    : m_adapters(adapters),
      m_airspace(airspace),
      m_agenda(agenda),
      m_notifications(notifications),
      m_connectTime(connectTime) {
    for (std::size_t i = 0; i < adapters.count(); ++i)
        m_decided.push_back({adapters.snapshot(i).inserted, adapters.radio(i)});
}

void Connections::setConnectTime(platform::Duration time) {
    const LockGuard<Mutex> lock(m_mutex);
    m_connectTime = time;
}

DWORD Connections::connect(std::size_t adapter, ConnectionWish wish) {
    const LockGuard<Mutex> lock(m_mutex);
    const DWORD result = check(adapter);
    if (result != ERROR_SUCCESS) return result;
    begin(adapter, std::move(wish), kAskedFor);
    return ERROR_SUCCESS;
}

Ticket Connections::connectBySystem(std::size_t adapter, ConnectionWish wish) {
    const LockGuard<Mutex> lock(m_mutex);
    return check(adapter) == ERROR_SUCCESS ? begin(adapter, std::move(wish), kSystemsOwn) : 0;
}

void Connections::disconnect(std::size_t adapter) {
    const LockGuard<Mutex> lock(m_mutex);
    if (m_link.adapter == adapter) end(kDisconnect, kUserDisconnected, kGiveUp);
}

Ticket Connections::drop(DWORD reason) {
    const LockGuard<Mutex> lock(m_mutex);
    return end(kDrop, reason, {});
}

Ticket Connections::dropFrom(std::span<const std::uint8_t> bssid) {
    const LockGuard<Mutex> lock(m_mutex);
    if (!std::equal(bssid.begin(), bssid.end(), m_link.bssid.begin(), m_link.bssid.end())) return 0;
    return end(kDrop, kConnectionLost, {});
}

Ticket Connections::changeRadio(std::size_t adapter, std::optional<DOT11_RADIO_STATE> hardware,
                                std::optional<DOT11_RADIO_STATE> software) {
    const LockGuard<Mutex> lock(m_mutex);
    RadioState& radio = m_decided.at(adapter).radio;
    radio = {hardware.value_or(radio.hardware), software.value_or(radio.software)};
    const Ticket told = m_notifications.post(
        {WLAN_NOTIFICATION_SOURCE_MSM, kRadioStateChange, m_adapters.guid(adapter),
         bytesOf(WLAN_PHY_RADIO_STATE{0, radio.software, radio.hardware}),
         [this, adapter, radio](Bytes&) { m_adapters.setRadio(adapter, radio.hardware, radio.software); }});
    return isOff(radio) ? std::max(told, lose(adapter)) : told;
}

// The connection belongs to the first adapter of the maker: one that comes before it takes its place.
Ticket Connections::insert(std::size_t adapter) {
    const LockGuard<Mutex> lock(m_mutex);
    if (adapter < m_link.adapter && m_adapters.isOfMaker(adapter)) lose(m_link.adapter);
    m_decided.at(adapter).isInserted = true;
    return postPresence(adapter, kArrival,
                        [this, adapter](Bytes&) { m_adapters.setInserted(adapter, true); });
}

Ticket Connections::pull(std::size_t adapter, std::function<void()> atRemoval) {
    const LockGuard<Mutex> lock(m_mutex);
    lose(adapter);
    m_decided.at(adapter).isInserted = false;
    return postPresence(adapter, kRemoval, [this, adapter, work = std::move(atRemoval)](Bytes&) {
        work();
        m_adapters.setInserted(adapter, false);
    });
}

Link Connections::shown(std::size_t adapter) const {
    const LockGuard<Mutex> lock(m_mutex);
    return m_shown.adapter == adapter ? m_shown : Link{};
}

DWORD Connections::check(std::size_t adapter) const {
    const Decided& decided = m_decided.at(adapter);
    if (!decided.isInserted) return ERROR_NOT_FOUND;
    return isOff(decided.radio) || m_adapters.served() != adapter ? ERROR_INVALID_STATE : ERROR_SUCCESS;
}

// The state changes at the request; while notifications of what ended are on their way, after the last of
// them.
Ticket Connections::begin(std::size_t adapter, ConnectionWish wish, const ConnectionCourse& course) {
    end(kDisconnect, kCancelled, kCancel);
    m_wish = std::move(wish);
    m_course = &course;
    m_link = Link{};
    m_link.adapter = adapter;
    m_link.guid = m_adapters.guid(adapter);
    m_link.mode = m_wish.mode;
    m_link.profileName = m_wish.profileName;
    m_link.ssid = m_wish.ssid;
    if (const auto network = m_airspace.findVisible(m_wish.ssid)) m_link.bssid = network->bssid;
    const bool isAllTold = m_untold == 0;
    const Ticket last = take(course.begin, kSucceeded);
    if (isAllTold) m_shown = m_link;
    m_agenda.add(platform::now() + m_connectTime, [this, attempt = ++m_attempts] { finish(attempt); });
    return last;
}

void Connections::finish(std::uint64_t attempt) {
    const LockGuard<Mutex> lock(m_mutex);
    if (attempt != m_attempts || m_link.state != wlan_interface_state_associating) return;
    const auto network = m_airspace.findVisible(m_wish.ssid);
    const DWORD reason = judge(network.get());
    if (reason == kSucceeded) {
        m_link.bssid = network ? network->bssid : Link{}.bssid;
        m_link.channel = network ? network->channel : 0;
    }
    take(reason == kSucceeded ? m_course->accept : m_course->refuse, reason);
}

DWORD Connections::judge(const Network* network) const {
    if (m_wish.succeeds) return *m_wish.succeeds ? kSucceeded : kNotAvailable;
    if (!network) return kNotAvailable;
    const bool isWelcome = m_wish.profile ? letsIn(*network, *m_wish.profile) : network->osProfile;
    return isWelcome ? kSucceeded : kRefused;
}

Ticket Connections::end(ConnectionSteps ofConnection, DWORD reason, ConnectionSteps ofAttempt) {
    if (m_link.state == wlan_interface_state_connected) return take(ofConnection, reason);
    if (m_link.state == wlan_interface_state_associating) return take(ofAttempt, kCancelled);
    return 0;
}

Ticket Connections::lose(std::size_t adapter) {
    return m_link.adapter == adapter ? end(kLose, kConnectionLost, kCancel) : 0;
}

Ticket Connections::take(ConnectionSteps steps, DWORD reason) {
    Ticket last = 0;
    for (const ConnectionStep& step : steps)
        last = take(step, reason);
    return last;
}

Ticket Connections::take(const ConnectionStep& step, DWORD reason) {
    if (step.state) m_link.state = *step.state;
    ++m_untold;
    const bool isAcm = step.source == WLAN_NOTIFICATION_SOURCE_ACM;
    Bytes data = isAcm ? connectionMessage(m_link, step.tellsReason ? reason : kSucceeded) : Bytes{};
    return m_notifications.post({step.source, step.code, m_link.guid, std::move(data),
                                 [this, link = m_link](Bytes&) { show(link); }});
}

Ticket Connections::postPresence(std::size_t adapter, DWORD code, std::function<void(Bytes&)> before) {
    return m_notifications.post(
        {WLAN_NOTIFICATION_SOURCE_ACM, code, m_adapters.guid(adapter), {}, std::move(before)});
}

void Connections::show(const Link& link) {
    const LockGuard<Mutex> lock(m_mutex);
    m_shown = link;
    --m_untold;
}

}  // namespace vexa::simulation
