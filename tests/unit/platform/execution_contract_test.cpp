#include <gtest/gtest.h>

#include <array>
#include <atomic>
#include <functional>
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
using test::inWorld;

TEST(Event, AnAutoResetEventEndsOneWaitAndAManualOneAll) {
    inWorld([] {
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
    });
}

TEST(Event, ASetEventStaysSetUntilItIsWaitedForOrReset) {
    inWorld([] {
        Event event(Reset::Auto);
        event.set();
        event.set();
        EXPECT_TRUE(event.wait(0ms));
        EXPECT_FALSE(event.wait(0ms));
        event.set();
        event.reset();
        EXPECT_FALSE(event.wait(0ms));
    });
}

TEST(Event, OfSeveralSetEventsTheLowestIndexIsTakenAndTheOthersStay) {
    inWorld([] {
        Event first(Reset::Auto);
        Event second(Reset::Auto);
        Event third(Reset::Auto);
        const std::array<Event*, 3> events{&first, &second, &third};
        third.set();
        second.set();
        EXPECT_EQ(waitForAny(events, 0ms), 1);
        EXPECT_EQ(waitForAny(events, 0ms), 2);
        EXPECT_EQ(waitForAny(events, 0ms), kTimedOut);
    });
}

TEST(Clock, AWaitEndsAtItsDeadlineAndNotBefore) {
    inWorld([] {
        Event never(Reset::Auto);
        std::atomic<bool> isOver{false};
        const Duration start = now();
        std::atomic<Duration> end{};
        Thread waiter;
        waiter.start("waiter", [&] {
            never.wait(250ms);
            end = now();
            isOver = true;
        });
        ASSERT_TRUE(advance(249ms));
        EXPECT_FALSE(isOver);
        ASSERT_TRUE(advance(2ms));
        EXPECT_TRUE(isOver);
        EXPECT_EQ(end.load() - start, 250ms);
        waiter.join();
    });
}

TEST(Clock, AdvancingRunsWhatFallsDueOnTheWayInItsOrder) {
    inWorld([] {
        Mutex mutex;
        std::vector<int> order;
        std::array<Thread, 3> sleepers;
        const std::array<int, 3> delays{30, 10, 20};
        for (std::size_t i = 0; i < sleepers.size(); ++i)
            sleepers[i].start("sleeper", [&, delay = delays[i]] {
                sleepFor(std::chrono::milliseconds(delay));
                {
                    const LockGuard lock(mutex);
                    order.push_back(delay);
                }
                sleepFor(100ms);
                const LockGuard lock(mutex);
                order.push_back(delay + 100);
            });
        ASSERT_TRUE(advance(500ms));
        for (Thread& sleeper : sleepers)
            sleeper.join();
        EXPECT_EQ(order, (std::vector<int>{10, 20, 30, 110, 120, 130}));
    });
}

TEST(Clock, ShiftingTheCalendarChangesNoWait) {
    inWorld([] {
        const Duration before = wallTime() - now();
        shiftWallTime(-1h);
        EXPECT_LT(wallTime() - now(), before - 30min);
        shiftWallTime(1h);
        Event never(Reset::Auto);
        Thread waiter;
        std::atomic<bool> isOver{false};
        waiter.start("waiter", [&] { isOver = !never.wait(1s); });
        shiftWallTime(2h);
        ASSERT_TRUE(advance(500ms));
        EXPECT_FALSE(isOver);
        ASSERT_TRUE(advance(500ms));
        waiter.join();
        shiftWallTime(-2h);
    });
}

// The compiler's check knows no recursion.
void addUnderTwoLocks(RecursiveMutex& mutex, int& counter) NO_THREAD_SAFETY_ANALYSIS {
    const LockGuard outer(mutex);
    const LockGuard inner(mutex);
    counter = counter + 1;
}

bool isHeldAfterOneOfTwoUnlocks(RecursiveMutex& mutex,
                                const std::function<void()>& meanwhile) NO_THREAD_SAFETY_ANALYSIS {
    mutex.lock();
    mutex.lock();
    mutex.unlock();
    const bool isHeld = mutex.isHeldByThisThread();
    meanwhile();
    mutex.unlock();
    return isHeld;
}

TEST(Mutex, ProtectsWhatItGuards) {
    inWorld([] {
        Mutex mutex;
        RecursiveMutex recursive;
        int plain = 0;
        int nested = 0;
        std::array<Thread, 4> threads;
        for (Thread& thread : threads)
            thread.start("counter", [&] {
                for (int i = 0; i < 100; ++i) {
                    {
                        const LockGuard lock(mutex);
                        plain = plain + 1;
                    }
                    addUnderTwoLocks(recursive, nested);
                }
            });
        for (Thread& thread : threads)
            thread.join();
        EXPECT_EQ(plain, 400);
        EXPECT_EQ(nested, 400);
    });
}

TEST(Mutex, ARecursiveMutexKnowsItsHolder) {
    inWorld([] {
        RecursiveMutex mutex;
        EXPECT_FALSE(mutex.isHeldByThisThread());
        std::atomic<bool> isHeldByOther{true};
        EXPECT_TRUE(isHeldAfterOneOfTwoUnlocks(mutex, [&] {
            Thread other;
            other.start("other", [&] { isHeldByOther = mutex.isHeldByThisThread(); });
            other.join();
        }));
        EXPECT_FALSE(isHeldByOther);
        EXPECT_FALSE(mutex.isHeldByThisThread());
    });
}

TEST(Thread, AJoinWithALimitGivesUpAndCanBeRepeated) {
    inWorld([] {
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
    });
}

TEST(PeriodicTimer, CallsOncePerPeriodUntilItIsDestroyed) {
    inWorld([] {
        std::atomic<int> calls{0};
        {
            const PeriodicTimer timer("timer", 10s, [&] { ++calls; });
            ASSERT_TRUE(advance(9999ms));
            EXPECT_EQ(calls, 0);
            ASSERT_TRUE(advance(1ms));
            EXPECT_EQ(calls, 1);
            ASSERT_TRUE(advance(25s));
            EXPECT_EQ(calls, 3);
        }
        ASSERT_TRUE(advance(60s));
        EXPECT_EQ(calls, 3);
    });
}

TEST(PeriodicTimer, ARestartBeginsANewPeriod) {
    inWorld([] {
        std::atomic<int> calls{0};
        PeriodicTimer timer("timer", 10s, [&] { ++calls; });
        for (int i = 0; i < 5; ++i) {
            ASSERT_TRUE(advance(9s));
            timer.restart();
        }
        EXPECT_EQ(calls, 0);
        ASSERT_TRUE(advance(10s));
        EXPECT_EQ(calls, 1);
    });
}

TEST(PeriodicTimer, ARestartNeverWaitsAndTheDestructorDoes) {
    inWorld([] {
        Event entered(Reset::Auto);
        Event mayLeave(Reset::Auto);
        std::atomic<bool> hasLeft{false};
        Thread owner;
        {
            auto timer = std::make_unique<PeriodicTimer>("timer", 1s, [&] {
                entered.set();
                mayLeave.wait();
                hasLeft = true;
            });
            ASSERT_TRUE(advance(1s));
            ASSERT_TRUE(entered.wait(0ms));
            timer->restart();
            std::atomic<bool> sawItLeave{false};
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
    });
}

}  // namespace
}  // namespace vexa::platform
