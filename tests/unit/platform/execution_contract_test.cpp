#include <gtest/gtest.h>

#include <array>
#include <atomic>
#include <memory>
#include <vector>

#include "platform/ClockControl.h"
#include "platform/Event.h"
#include "platform/Mutex.h"
#include "platform/PeriodicTimer.h"
#include "platform/Thread.h"
#include "unit/platform/World.h"

namespace vexa::platform {
namespace {

using namespace std::chrono_literals;

IN_WORLD(Event, AnAutoResetEventEndsOneWaitAndAManualOneAll) {
    for (const Reset reset : {Reset::Auto, Reset::Manual}) {
        Event event(reset);
        std::atomic<int> woken{0};
        std::array<Thread, 3> waiters;
        for (Thread& waiter : waiters)
            waiter.start("waiter", [&] {
                if (event.wait(1s)) ++woken;
            });
        ASSERT_TRUE(advance(10ms));
        event.set();
        ASSERT_TRUE(advance(2s));
        for (Thread& waiter : waiters)
            waiter.join();
        EXPECT_EQ(woken, reset == Reset::Auto ? 1 : 3);
        EXPECT_EQ(event.wait(0ms), reset == Reset::Manual);
    }
}

IN_WORLD(Event, StaysSetUntilItIsWaitedForOrResetAndTheLowestIndexIsTaken) {
    Event first(Reset::Auto);
    Event second(Reset::Auto);
    Event third(Reset::Auto);
    const std::array<Event*, 3> events{&first, &second, &third};
    for (Event* const event : {&first, &third, &second, &second})
        event->set();
    first.reset();
    EXPECT_EQ(waitForAny(events, 0ms), 1);
    EXPECT_EQ(waitForAny(events, 0ms), 2);
    EXPECT_EQ(waitForAny(events, 0ms), kTimedOut);
}

IN_WORLD(Clock, AWaitEndsAtItsDeadlineAndNotBeforeWhateverTheCalendarSays) {
    Event never(Reset::Auto);
    std::atomic<bool> isOver{false};
    std::atomic<Duration> end{};
    const Duration start = now();
    const Duration lead = wallTime() - start;
    Thread waiter;
    waiter.start("waiter", [&] {
        isOver = !never.wait(250ms);
        end = now();
    });
    shiftWallTime(-1h);
    EXPECT_LT(wallTime() - now(), lead - 30min);
    shiftWallTime(3h);
    ASSERT_TRUE(advance(249ms));
    EXPECT_FALSE(isOver);
    ASSERT_TRUE(advance(2ms));
    EXPECT_TRUE(isOver);
    EXPECT_EQ(end.load() - start, 250ms);
    waiter.join();
    shiftWallTime(-2h);
}

IN_WORLD(Clock, AdvancingRunsWhatFallsDueOnTheWayInItsOrder) {
    Mutex mutex;
    std::vector<int> order;
    const auto note = [&](int delay) {
        const LockGuard lock(mutex);
        order.push_back(delay);
    };
    std::array<Thread, 3> sleepers;
    const std::array<int, 3> delays{30, 10, 20};
    for (std::size_t i = 0; i < sleepers.size(); ++i)
        sleepers[i].start("sleeper", [&, delay = delays[i]] {
            sleepFor(std::chrono::milliseconds(delay));
            note(delay);
            sleepFor(100ms);
            note(delay + 100);
        });
    ASSERT_TRUE(advance(500ms));
    for (Thread& sleeper : sleepers)
        sleeper.join();
    EXPECT_EQ(order, (std::vector<int>{10, 20, 30, 110, 120, 130}));
}

// The compiler's check knows no recursion. True if the lock was held after one of two unlocks.
bool addUnderTwoLocks(RecursiveMutex& mutex, int& counter) NO_THREAD_SAFETY_ANALYSIS {
    const LockGuard outer(mutex);
    {
        const LockGuard inner(mutex);
        counter = counter + 1;
    }
    return mutex.isHeldByThisThread();
}

IN_WORLD(Mutex, ProtectsWhatItGuardsAndARecursiveOneKnowsItsHolder) {
    Mutex mutex;
    RecursiveMutex recursive;
    int plain = 0;
    int nested = 0;
    int held = 0;
    std::array<Thread, 4> threads;
    for (Thread& thread : threads)
        thread.start("counter", [&] {
            for (int i = 0; i < 100; ++i) {
                const bool isHeld = addUnderTwoLocks(recursive, nested);
                const LockGuard lock(mutex);
                plain = plain + 1;
                held = held + (isHeld ? 1 : 0);
            }
        });
    for (Thread& thread : threads)
        thread.join();
    EXPECT_EQ(plain, 400);
    EXPECT_EQ(nested, 400);
    EXPECT_EQ(held, 400);
    EXPECT_FALSE(recursive.isHeldByThisThread());
    const LockGuard lock(recursive);
    Thread other;
    other.start("other", [&] { EXPECT_FALSE(recursive.isHeldByThisThread()); });
    other.join();
}

IN_WORLD(Thread, AJoinWithALimitGivesUpAndCanBeRepeated) {
    Event mayEnd(Reset::Auto);
    Thread worker;
    ASSERT_TRUE(worker.start("worker", [&] {
        EXPECT_TRUE(worker.isCurrent());
        mayEnd.wait();
    }));
    EXPECT_FALSE(worker.isCurrent());
    std::atomic<bool> gaveUp{false};
    Thread joiner;
    joiner.start("joiner", [&] { gaveUp = !worker.join(100ms); });
    ASSERT_TRUE(advance(200ms));
    joiner.join();
    EXPECT_TRUE(gaveUp);
    mayEnd.set();
    EXPECT_TRUE(worker.join());
}

IN_WORLD(PeriodicTimer, CallsOncePerPeriodWhichARestartBeginsAnewUntilItIsDestroyed) {
    std::atomic<int> calls{0};
    {
        PeriodicTimer timer("timer", 10s, [&] { ++calls; });
        for (int i = 0; i < 5; ++i) {
            ASSERT_TRUE(advance(9s));
            timer.restart();
        }
        ASSERT_TRUE(advance(9999ms));
        EXPECT_EQ(calls, 0);
        ASSERT_TRUE(advance(1ms));
        EXPECT_EQ(calls, 1);
        ASSERT_TRUE(advance(25s));
        EXPECT_EQ(calls, 3);
    }
    ASSERT_TRUE(advance(60s));
    EXPECT_EQ(calls, 3);
}

IN_WORLD(PeriodicTimer, ARestartNeverWaitsAndTheDestructorDoes) {
    Event entered(Reset::Auto);
    Event mayLeave(Reset::Auto);
    std::atomic<bool> hasLeft{false};
    auto timer = std::make_unique<PeriodicTimer>("timer", 1s, [&] {
        entered.set();
        mayLeave.wait();
        hasLeft = true;
    });
    ASSERT_TRUE(advance(1s));
    ASSERT_TRUE(entered.wait(0ms));
    timer->restart();
    std::atomic<bool> sawItLeave{false};
    Thread owner;
    owner.start("owner", [&] {
        timer.reset();
        sawItLeave = hasLeft.load();
    });
    ASSERT_TRUE(advance(10ms));
    EXPECT_FALSE(hasLeft);
    mayLeave.set();
    owner.join();
    EXPECT_TRUE(sawItLeave);
}

}  // namespace
}  // namespace vexa::platform
