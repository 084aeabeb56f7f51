#pragma once

#include <condition_variable>
#include <cstdint>
#include <map>
#include <mutex>
#include <span>
#include <utility>
#include <vector>

#include "platform/Event.h"

namespace vexa::platform {

struct Waiter;

struct Event::State {
    const Reset reset;
    bool isSet = false;
    std::vector<Waiter*> waiters = {};
};

/// One thread in a wait. It stands on the stack of that thread; whoever releases it takes it off all lists.
struct Waiter {
    std::span<Event::State* const> events;
    Timeout deadline;
    std::uint64_t sequence = 0;
    bool isReleased = false;
    int outcome = kTimedOut;
    std::condition_variable wake = {};
};

/// All waits of the process, and the clock. A thread that ends another's wait releases it on the spot, so
/// that the count of threads that are at work is exact at every moment: the clock of a simulated machine
/// moves on only when it is 0.
class Scheduler {
public:
    static Scheduler& get();

    int wait(std::span<Event::State* const> events, Timeout deadline);
    void set(Event::State& event);
    void reset(Event::State& event);

    void beginWork();
    void endWork();

    Duration now();
    void setSpeed(double speed);
    bool advance(Duration span);
    void requestAdvance(Duration span);

    /// While somebody waits for the end of a thread, a clock that stands still must not hold that thread in a
    /// sleep: time moves on, at most by this, until endJoin().
    std::uint64_t beginJoin(Duration limit);
    void endJoin(std::uint64_t id);

private:
    using Lock = std::unique_lock<std::mutex>;
    using RealTime = std::chrono::steady_clock::time_point;
    /// A wish to move the clock on, and who waits until it has been fulfilled; null: nobody.
    struct Advance {
        std::uint64_t id;
        Waiter* waiter;
    };
    using DeadlineKey = std::pair<Duration, std::uint64_t>;

    Duration nowLocked() const;
    RealTime realTimeOf(Duration instant) const;
    void moveClockTo(Duration instant);
    void wakeTimedWaiters();
    void enlist(Waiter& waiter);
    void release(Waiter& waiter, int outcome);
    void releaseFor(Waiter& waiter, const Event::State& event);
    void sleepUntilReleased(Lock& lock, Waiter& waiter);
    void threadRests();
    bool releaseNextDue(Duration target);
    void finishAdvances(Duration target);

    std::mutex m_mutex;
    int m_atWork = 1;  // the main thread
    std::uint64_t m_nextSequence = 0;
    std::map<DeadlineKey, Waiter*> m_deadlines;
    std::multimap<Duration, Advance> m_advances;

    double m_speed = 1.0;
    RealTime m_realReference = std::chrono::steady_clock::now();
    Duration m_reference{0};
};

}  // namespace vexa::platform
