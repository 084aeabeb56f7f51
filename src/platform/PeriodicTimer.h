#pragma once

#include <functional>
#include <string>

#include "platform/Clock.h"
#include "platform/Event.h"
#include "platform/Mutex.h"
#include "platform/Thread.h"

namespace vexa::platform {

/// Calls a function once a period, on a thread of its own, first one period after construction. Calls never
/// overlap.
class PeriodicTimer {
public:
    PeriodicTimer(const std::string& name, Duration period, std::function<void()> callback);

    /// Waits for a callback that is running. REQUIRES: the caller holds no lock that the callback takes.
    ~PeriodicTimer();
    PeriodicTimer(const PeriodicTimer&) = delete;
    PeriodicTimer& operator=(const PeriodicTimer&) = delete;

    /// Begins a new period at this moment. Never waits: a running callback goes on. Any thread, also the
    /// callback itself, with any lock held.
    void restart();

private:
    void run();
    Duration deadline();
    bool takeDue();

    const Duration m_period;
    const std::function<void()> m_callback;
    Mutex m_mutex;
    Duration m_deadline GUARDED_BY(m_mutex);
    Event m_stop{Reset::Manual};
    Event m_restarted{Reset::Auto};
    Thread m_thread;
};

}  // namespace vexa::platform
