#include "platform/PeriodicTimer.h"

#include <algorithm>
#include <array>
#include <utility>

namespace vexa::platform {

PeriodicTimer::PeriodicTimer(const std::string& name, Duration period, std::function<void()> callback)
    : m_period(period), m_callback(std::move(callback)), m_deadline(now() + period) {
    m_thread.start(name, [this] { run(); });
}

PeriodicTimer::~PeriodicTimer() {
    m_stop.set();
    if (m_thread.isStarted()) m_thread.join();
}

void PeriodicTimer::restart() {
    {
        const LockGuard lock(m_mutex);
        m_deadline = now() + m_period;
    }
    m_restarted.set();
}

Duration PeriodicTimer::deadline() {
    const LockGuard lock(m_mutex);
    return m_deadline;
}

// A restart that comes between the end of the wait and this test moves the deadline away, and no call is due.
bool PeriodicTimer::takeDue() {
    const LockGuard lock(m_mutex);
    const Duration present = now();
    if (m_deadline > present) return false;
    m_deadline = std::max(m_deadline + m_period, present);
    return true;
}

void PeriodicTimer::run() {
    const std::array<Event*, 2> events{&m_stop, &m_restarted};
    for (;;) {
        const int woken = waitForAnyUntil(events, deadline());
        if (woken == 0) return;
        if (woken == kTimedOut && takeDue()) m_callback();
    }
}

}  // namespace vexa::platform
