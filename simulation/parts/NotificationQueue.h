#pragma once

#include <cstdint>
#include <deque>
#include <functional>
#include <map>
#include <memory>
#include <vector>

#include "platform/Event.h"
#include "platform/Mutex.h"
#include "platform/Thread.h"
#include "platform/WlanApi.h"
#include "simulation/text/Text.h"

namespace vexa::simulation {

/// Names a notification on its way; 0: none.
using Ticket = std::uint64_t;

/// One notification of the WLAN service.
struct Notification {
    DWORD source = 0;
    DWORD code = 0;
    GUID guid{};
    Bytes data;  ///< Empty: null data.

    /// The change that it tells of, made just before it is delivered; may fill in the data. Null: none.
    std::function<void(Bytes& data)> before;
};

/// Delivers notifications on one thread, in the order in which they were posted, to the callbacks that were
/// registered at that moment and still are. With none it is dropped, which counts as delivered. No lock is
/// held while a callback runs.
class NotificationQueue {
public:
    NotificationQueue();
    ~NotificationQueue();
    NotificationQueue(const NotificationQueue&) = delete;
    NotificationQueue& operator=(const NotificationQueue&) = delete;

    /// At most one callback per client, an open handle. Gives the sources that the client had before, 0 for
    /// none; a new registration takes the place of the old one.
    DWORD registerCallback(HANDLE client, DWORD sources, WLAN_NOTIFICATION_CALLBACK callback, PVOID context);

    /// Waits for a running callback of this client, unless it is the caller itself. Gives the sources that it
    /// had.
    DWORD unregister(HANDLE client);

    Ticket post(Notification notification);

    /// Returns once every callback for this notification and those before it has returned, or after stop().
    /// Not to be called by a callback.
    void waitDelivered(Ticket ticket);

    /// Ends the delivery; what still waits is dropped.
    void stop();

private:
    struct Registration;
    struct Item;
    struct Waiter;
    using Receivers = std::vector<std::shared_ptr<Registration>>;

    void run();
    bool takeNext(Item& item);
    void deliver(Item& item);
    static void call(const Registration& receiver, WLAN_NOTIFICATION_DATA& block);
    bool beginCallback(Registration& registration);
    void endCallback(Registration& registration);
    void finish(Ticket ticket);

    platform::Mutex m_mutex;
    std::map<HANDLE, std::shared_ptr<Registration>> m_registrations GUARDED_BY(m_mutex);
    std::deque<Item> m_items GUARDED_BY(m_mutex);
    std::vector<Waiter> m_waiters GUARDED_BY(m_mutex);
    Ticket m_posted GUARDED_BY(m_mutex) = 0;
    Ticket m_delivered GUARDED_BY(m_mutex) = 0;
    bool m_stopped GUARDED_BY(m_mutex) = false;
    platform::Event m_wake{platform::Reset::Auto, "a notification to deliver"};
    platform::Thread m_thread;
};

}  // namespace vexa::simulation
