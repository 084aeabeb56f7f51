#include "simulation/parts/Agenda.h"

#include <array>

namespace vexa::simulation {

using platform::LockGuard;
using platform::Mutex;

Agenda::Agenda() {
    m_thread.start("agenda", [this] { run(); });
}

Agenda::~Agenda() {
    stop();
}

void Agenda::add(platform::Duration at, std::function<void()> work) {
    {
        const LockGuard<Mutex> lock(m_mutex);
        m_entries.emplace(Key{at, ++m_sequence}, std::move(work));
    }
    m_added.set();
}

void Agenda::stop() {
    m_stop.set();
    if (m_thread.isStarted() && !m_thread.isCurrent()) m_thread.join();
}

void Agenda::run() {
    constexpr int kStopIndex = 0;
    const std::array<platform::Event*, 2> events = {&m_stop, &m_added};
    while (platform::waitForAnyUntil(events, nextDue()) != kStopIndex) {
        while (const auto work = takeDue())
            work();
    }
}

std::function<void()> Agenda::takeDue() {
    const LockGuard<Mutex> lock(m_mutex);
    if (m_entries.empty() || m_entries.begin()->first.first > platform::now()) return nullptr;
    auto work = std::move(m_entries.begin()->second);
    m_entries.erase(m_entries.begin());
    return work;
}

platform::Timeout Agenda::nextDue() {
    const LockGuard<Mutex> lock(m_mutex);
    if (m_entries.empty()) return platform::kForever;
    return m_entries.begin()->first.first;
}

}  // namespace vexa::simulation
