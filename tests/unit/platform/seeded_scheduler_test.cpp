#include <gtest/gtest.h>

#include <array>
#include <set>
#include <string>

#include "platform/Event.h"
#include "platform/Mutex.h"
#include "platform/Thread.h"
#include "platform/seeded/Seeded.h"

namespace vexa::platform {
namespace {

using namespace std::chrono_literals;

// Three threads that meet at a lock and a clock; what they did, in order.
std::string race(std::uint64_t seed) {
    std::string trace;
    runSeeded(seed, [&] {
        Mutex mutex;
        std::array<Thread, 3> threads;
        for (std::size_t i = 0; i < threads.size(); ++i)
            threads[i].start("racer", [&, name = static_cast<char>('a' + i)] {
                for (int round = 0; round < 4; ++round) {
                    {
                        const LockGuard lock(mutex);
                        trace += name;
                    }
                    sleepFor(std::chrono::milliseconds(round));
                }
            });
        for (Thread& thread : threads)
            thread.join();
    });
    return trace;
}

TEST(SeededScheduler, TheSameSeedGivesTheSameOrderAndOthersGiveOthers) {
    std::set<std::string> orders;
    for (std::uint64_t seed = 0; seed < 40; ++seed) {
        const std::string trace = race(seed);
        EXPECT_EQ(trace.size(), 12U);
        EXPECT_EQ(race(seed), trace) << "seed " << seed;
        orders.insert(trace);
    }
    EXPECT_GT(orders.size(), 10U);
}

TEST(SeededScheduler, AnUnlockedRaceIsFoundBySomeSeed) {
    int broken = 0;
    for (std::uint64_t seed = 0; seed < 50; ++seed) {
        int counter = 0;
        runSeeded(seed, [&] {
            Mutex unrelated;
            const auto add = [&] {
                const int seen = counter;
                { const LockGuard lock(unrelated); }
                counter = seen + 1;
            };
            Thread other;
            other.start("other", add);
            add();
            other.join();
        });
        if (counter != 2) ++broken;
    }
    EXPECT_GT(broken, 0);
}

TEST(SeededSchedulerDeathTest, ADeadlockIsReportedWithItsSeedAndWhatEachThreadWaitsFor) {
    ::testing::FLAGS_gtest_death_test_style = "threadsafe";
    const auto embrace = [] {
        for (std::uint64_t seed = 0; seed < 1000; ++seed)
            runSeeded(seed, [] {
                Mutex left("the left lock");
                Mutex right("the right lock");
                Thread other;
                other.start("other", [&] {
                    const LockGuard first(right);
                    const LockGuard second(left);
                });
                {
                    const LockGuard first(left);
                    const LockGuard second(right);
                }
                other.join();
            });
    };
    EXPECT_DEATH(embrace(),
                 "Deadlock with seed [0-9]+ at 0 us:\n"
                 "  story waits for the right lock\n"
                 "  other waits for the left lock");
    EXPECT_DEATH(runSeeded(7,
                           [] {
                               Event never(Reset::Auto, "an event that nobody sets");
                               never.wait();
                           }),
                 "Deadlock with seed 7 at 0 us:\n  story waits for an event that nobody sets");
}

}  // namespace
}  // namespace vexa::platform
