#include "simulation/parts/NotificationQueue.h"

#include <algorithm>

#include "simulation/parts/MachineCode.h"

namespace vexa::simulation {

using platform::Event;
using platform::LockGuard;
using platform::Mutex;

struct NotificationQueue::Registration {
    DWORD sources;
    WLAN_NOTIFICATION_CALLBACK callback;
    PVOID context;
    bool removed = false;
    bool running = false;
    Event ended{platform::Reset::Manual,
                "the end of a notification handler"};  // set for good when a removed one no longer runs
};

struct NotificationQueue::Item {
    Ticket ticket = 0;
    Notification notification;
    Receivers receivers;
};

struct NotificationQueue::Waiter {
    Ticket ticket;
    std::shared_ptr<Event> delivered;
};

NotificationQueue::NotificationQueue() {
    m_thread.start("wlan notifications", [this] { run(); });
}

NotificationQueue::~NotificationQueue() {
    stop();
}

DWORD NotificationQueue::registerCallback(HANDLE client, DWORD sources, WLAN_NOTIFICATION_CALLBACK callback,
                                          PVOID context) {
    const DWORD previous = unregister(client);
    auto registration = std::make_shared<Registration>();
    registration->sources = sources;
    registration->callback = callback;
    registration->context = context;
    const LockGuard<Mutex> lock(m_mutex);
    m_registrations[client] = std::move(registration);
    return previous;
}

DWORD NotificationQueue::unregister(HANDLE client) {
    std::shared_ptr<Registration> registration;
    bool running = false;
    {
        const LockGuard<Mutex> lock(m_mutex);
        const auto found = m_registrations.find(client);
        if (found == m_registrations.end()) return WLAN_NOTIFICATION_SOURCE_NONE;
        registration = found->second;
        registration->removed = true;
        running = registration->running;
        m_registrations.erase(found);
    }
    if (running && !m_thread.isCurrent()) registration->ended.wait();
    return registration->sources;
}

Ticket NotificationQueue::post(Notification notification) {
    Ticket ticket = 0;
    {
        const LockGuard<Mutex> lock(m_mutex);
        ticket = ++m_posted;
        Item item{ticket, std::move(notification), {}};
        for (const auto& [client, registration] : m_registrations) {
            if (registration->sources & item.notification.source) item.receivers.push_back(registration);
        }
        m_items.push_back(std::move(item));
    }
    m_wake.set();
    return ticket;
}

void NotificationQueue::waitDelivered(Ticket ticket) {
    auto delivered = std::make_shared<Event>(platform::Reset::Manual, "the delivery of a notification");
    {
        const LockGuard<Mutex> lock(m_mutex);
        if (m_stopped || m_delivered >= ticket) return;
        m_waiters.push_back({ticket, delivered});
    }
    delivered->wait();
}

void NotificationQueue::stop() {
    {
        const LockGuard<Mutex> lock(m_mutex);
        m_stopped = true;
        for (const Waiter& waiter : m_waiters)
            waiter.delivered->set();
        m_waiters.clear();
    }
    m_wake.set();
    if (m_thread.isStarted() && !m_thread.isCurrent()) m_thread.join();
}

void NotificationQueue::run() {
    const MachineCode here;
    for (;;) {
        Item item;
        if (takeNext(item)) {
            deliver(item);
            finish(item.ticket);
            continue;
        }
        {
            const LockGuard<Mutex> lock(m_mutex);
            if (m_stopped) return;
        }
        m_wake.wait();
    }
}

bool NotificationQueue::takeNext(Item& item) {
    const LockGuard<Mutex> lock(m_mutex);
    if (m_stopped || m_items.empty()) return false;
    item = std::move(m_items.front());
    m_items.pop_front();
    return true;
}

void NotificationQueue::deliver(Item& item) {
    Notification& notification = item.notification;
    if (notification.before) notification.before(notification.data);
    for (const auto& receiver : item.receivers) {
        if (!beginCallback(*receiver)) continue;
        Bytes data = notification.data;
        WLAN_NOTIFICATION_DATA block{};
        block.NotificationSource = notification.source;
        block.NotificationCode = notification.code;
        block.InterfaceGuid = notification.guid;
        block.dwDataSize = static_cast<DWORD>(data.size());
        block.pData = data.empty() ? nullptr : data.data();
        call(*receiver, block);
        endCallback(*receiver);
    }
}

void NotificationQueue::call(const Registration& receiver, WLAN_NOTIFICATION_DATA& block) {
    const MachineCode theProgram(false);
    receiver.callback(&block, receiver.context);
}

bool NotificationQueue::beginCallback(Registration& registration) {
    const LockGuard<Mutex> lock(m_mutex);
    registration.running = !registration.removed;
    return registration.running;
}

void NotificationQueue::endCallback(Registration& registration) {
    const LockGuard<Mutex> lock(m_mutex);
    registration.running = false;
    if (registration.removed) registration.ended.set();
}

void NotificationQueue::finish(Ticket ticket) {
    const LockGuard<Mutex> lock(m_mutex);
    m_delivered = ticket;
    const auto due = std::partition(m_waiters.begin(), m_waiters.end(),
                                    [&](const Waiter& waiter) { return waiter.ticket > ticket; });
    for (auto waiter = due; waiter != m_waiters.end(); ++waiter)
        waiter->delivered->set();
    m_waiters.erase(due, m_waiters.end());
}

}  // namespace vexa::simulation
