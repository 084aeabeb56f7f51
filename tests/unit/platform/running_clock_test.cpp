#include <gtest/gtest.h>

#include "platform/ClockControl.h"
#include "platform/Event.h"
#include "platform/Thread.h"

namespace vexa::platform {
namespace {

using namespace std::chrono_literals;

// Otherwise a service whose clock stands still could not be stopped while a thread of it sleeps.
TEST(RunningClock, AJoinWithALimitMovesAStandingClockOnToTheEndOfTheThreadOrToItsLimit) {
    setClockSpeed(0);
    Duration start = now();
    Thread sleeper;
    ASSERT_TRUE(sleeper.start("sleeper", [] { sleepFor(10s); }));
    EXPECT_TRUE(sleeper.join(11s)) << "also where it comes to its sleep after we come to the join";
    Event mayEnd(Reset::Auto);
    EXPECT_FALSE(mayEnd.wait(0ms));
    EXPECT_EQ(now() - start, 10s);
    start = now();
    Thread worker;
    ASSERT_TRUE(worker.start("worker", [&] { mayEnd.wait(); }));
    EXPECT_FALSE(worker.join(3s));
    EXPECT_EQ(now() - start, 3s);
    mayEnd.set();
    EXPECT_TRUE(worker.join());
}

TEST(RunningClock, RunsAsFastAsItIsTold) {
    setClockSpeed(10000);
    const Duration start = now();
    sleepFor(20s);
    EXPECT_GE(now() - start, 20s);
    setClockSpeed(0);
    const Duration standing = now();
    EXPECT_EQ(now(), standing);
}

}  // namespace
}  // namespace vexa::platform
