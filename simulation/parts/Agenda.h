#pragma once

#include <cstdint>
#include <functional>
#include <map>
#include <utility>

#include "platform/Clock.h"
#include "platform/Event.h"
#include "platform/Mutex.h"
#include "platform/Thread.h"

namespace vexa::simulation {

/// What is to happen later. Runs it on one thread of its own, when its time has come; what is due at the same
/// time, in the order in which it was added. Holds no lock meanwhile.
class Agenda {
public:
    Agenda();
    ~Agenda();
    Agenda(const Agenda&) = delete;
    Agenda& operator=(const Agenda&) = delete;

    /// `at` is on the scale of platform::now(). Any thread, also what the agenda runs.
    void add(platform::Duration at, std::function<void()> work);

    /// Waits for what runs; the rest never runs.
    void stop();

private:
    using Key = std::pair<platform::Duration, std::uint64_t>;

    void run();
    std::function<void()> takeDue();
    platform::Timeout nextDue();

    platform::Mutex m_mutex;
    std::map<Key, std::function<void()>> m_entries GUARDED_BY(m_mutex);
    std::uint64_t m_sequence GUARDED_BY(m_mutex) = 0;
    platform::Event m_stop{platform::Reset::Manual, "the end of the agenda"};
    platform::Event m_added{platform::Reset::Auto, "something on the agenda"};
    platform::Thread m_thread;
};

}  // namespace vexa::simulation
