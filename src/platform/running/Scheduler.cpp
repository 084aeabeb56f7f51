#include "platform/running/Scheduler.h"

#include <algorithm>
#include <cstddef>
#include <memory>

namespace vexa::platform {

namespace {

constexpr std::chrono::seconds kRestLimit{10};

template <class T>
void eraseValue(std::vector<T>& values, const T& value) {
    values.erase(std::remove(values.begin(), values.end(), value), values.end());
}

}  // namespace

// Never destroyed: threads may still wait while the process ends.
Scheduler& Scheduler::get() {
    alignas(Scheduler) static std::byte storage[sizeof(Scheduler)];
    static Scheduler& scheduler = *std::construct_at(reinterpret_cast<Scheduler*>(storage));
    return scheduler;
}

int Scheduler::wait(std::span<Event::State* const> events, Timeout deadline) {
    Lock lock(m_mutex);
    for (std::size_t i = 0; i < events.size(); ++i) {
        if (!events[i]->isSet) continue;
        if (events[i]->reset == Reset::Auto) events[i]->isSet = false;
        return static_cast<int>(i);
    }
    if (deadline && *deadline <= nowLocked()) return kTimedOut;

    Waiter waiter{events, deadline};
    enlist(waiter);
    threadRests();
    sleepUntilReleased(lock, waiter);
    return waiter.outcome;
}

void Scheduler::enlist(Waiter& waiter) {
    waiter.sequence = ++m_nextSequence;
    for (Event::State* event : waiter.events)
        event->waiters.push_back(&waiter);
    if (waiter.deadline) m_deadlines.emplace(DeadlineKey{*waiter.deadline, waiter.sequence}, &waiter);
}

void Scheduler::sleepUntilReleased(Lock& lock, Waiter& waiter) {
    while (!waiter.isReleased) {
        if (!waiter.deadline || m_speed <= 0.0) {
            waiter.wake.wait(lock);
        } else {
            waiter.wake.wait_until(lock, realTimeOf(*waiter.deadline));
            if (!waiter.isReleased && m_speed > 0.0 && nowLocked() >= *waiter.deadline)
                release(waiter, kTimedOut);
        }
    }
}

void Scheduler::release(Waiter& waiter, int outcome) {
    for (Event::State* event : waiter.events)
        eraseValue(event->waiters, &waiter);
    if (waiter.deadline) m_deadlines.erase({*waiter.deadline, waiter.sequence});
    waiter.isReleased = true;
    waiter.outcome = outcome;
    ++m_atWork;
    waiter.wake.notify_one();
}

void Scheduler::releaseFor(Waiter& waiter, const Event::State& event) {
    const auto found = std::find(waiter.events.begin(), waiter.events.end(), &event);
    release(waiter, static_cast<int>(found - waiter.events.begin()));
}

void Scheduler::set(Event::State& event) {
    const Lock lock(m_mutex);
    if (event.reset == Reset::Auto && !event.waiters.empty()) {
        releaseFor(*event.waiters.front(), event);
        return;
    }
    event.isSet = true;
    while (!event.waiters.empty())
        releaseFor(*event.waiters.front(), event);
}

void Scheduler::reset(Event::State& event) {
    const Lock lock(m_mutex);
    event.isSet = false;
}

void Scheduler::beginWork() {
    const Lock lock(m_mutex);
    ++m_atWork;
}

void Scheduler::endWork() {
    const Lock lock(m_mutex);
    threadRests();
}

// The last thread that comes to rest moves the clock on, if somebody has asked for that.
void Scheduler::threadRests() {
    --m_atWork;
    while (m_atWork == 0 && !m_advances.empty()) {
        const Duration target = m_advances.begin()->first;
        if (!releaseNextDue(target)) finishAdvances(target);
    }
}

bool Scheduler::releaseNextDue(Duration target) {
    if (m_deadlines.empty() || m_deadlines.begin()->first.first > target) return false;
    Waiter& waiter = *m_deadlines.begin()->second;
    moveClockTo(*waiter.deadline);
    release(waiter, kTimedOut);
    return true;
}

void Scheduler::finishAdvances(Duration target) {
    moveClockTo(target);
    while (!m_advances.empty() && m_advances.begin()->first <= target) {
        Waiter* waiter = m_advances.begin()->second.waiter;
        m_advances.erase(m_advances.begin());
        if (waiter != nullptr) release(*waiter, 0);
    }
    wakeTimedWaiters();
}

bool Scheduler::advance(Duration span) {
    Lock lock(m_mutex);
    Waiter waiter{{}, std::nullopt};
    const auto request = m_advances.emplace(nowLocked() + span, Advance{++m_nextSequence, &waiter});
    threadRests();
    const RealTime limit = std::chrono::steady_clock::now() + kRestLimit;
    while (!waiter.isReleased) {
        if (waiter.wake.wait_until(lock, limit) == std::cv_status::no_timeout || waiter.isReleased) continue;
        m_advances.erase(request);
        ++m_atWork;
        return false;
    }
    return true;
}

void Scheduler::requestAdvance(Duration span) {
    const Lock lock(m_mutex);
    m_advances.emplace(nowLocked() + span, Advance{++m_nextSequence, nullptr});
}

std::uint64_t Scheduler::beginJoin(Duration limit) {
    const Lock lock(m_mutex);
    const std::uint64_t id = ++m_nextSequence;
    if (m_speed <= 0.0) m_advances.emplace(nowLocked() + limit, Advance{id, nullptr});
    return id;
}

void Scheduler::endJoin(std::uint64_t id) {
    const Lock lock(m_mutex);
    std::erase_if(m_advances, [id](const auto& advance) { return advance.second.id == id; });
}

Duration Scheduler::now() {
    const Lock lock(m_mutex);
    return nowLocked();
}

Duration Scheduler::nowLocked() const {
    const std::chrono::duration<double, std::micro> real = std::chrono::steady_clock::now() - m_realReference;
    return m_reference + Duration(static_cast<Duration::rep>(real.count() * m_speed));
}

// Rounded up, so that a wait that ends by the wall clock has reached its deadline.
Scheduler::RealTime Scheduler::realTimeOf(Duration instant) const {
    const std::chrono::duration<double, std::micro> real(
        static_cast<double>((instant - m_reference).count()) / m_speed);
    constexpr std::chrono::hours kFar{24 * 365};
    if (real > kFar) return m_realReference + kFar;
    return m_realReference + std::chrono::ceil<std::chrono::microseconds>(real);
}

void Scheduler::moveClockTo(Duration instant) {
    if (instant <= nowLocked()) return;
    m_reference = instant;
    m_realReference = std::chrono::steady_clock::now();
}

void Scheduler::setSpeed(double speed) {
    const Lock lock(m_mutex);
    m_reference = nowLocked();
    m_realReference = std::chrono::steady_clock::now();
    m_speed = speed;
    wakeTimedWaiters();
}

void Scheduler::wakeTimedWaiters() {
    for (const auto& [key, waiter] : m_deadlines)
        waiter->wake.notify_one();
}

namespace {

// The main thread is at work from the beginning, whoever waits first.
[[maybe_unused]] const Scheduler& g_builtBeforeMain = Scheduler::get();

}  // namespace

}  // namespace vexa::platform
