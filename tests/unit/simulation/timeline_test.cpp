#include "platform/Clock.h"

#include <gtest/gtest.h>

#include "TestMachine.h"
#include "platform/Event.h"

namespace vexa::simulation {
namespace {

double milliseconds(platform::Duration duration) {
    return static_cast<double>(duration.count()) / 1000;
}

TEST(MachineTime, AdvanceDeliversInTheOrderInWhichThingsAreDue) {
    TestMachine machine(
        "{'timeline': [{'atMs': 300, 'do': 'notify', 'source': 8, 'code': 3},"
        "{'atMs': 100, 'do': 'notify', 'source': 8, 'code': 1},"
        "{'atMs': 200, 'do': 'roam'}, {'atMs': 200, 'do': 'notify', 'source': 8, 'code': 2}]}");
    Listener listener;
    std::string times;
    listener.onNotification = [&](const WLAN_NOTIFICATION_DATA&) {
        times += std::to_string(
                     std::chrono::duration_cast<std::chrono::milliseconds>(machine->elapsed()).count()) +
                 " ";
    };
    EXPECT_EQ(machine.ask("{'do': 'advance', 'ms': 250}"), R"({"ok":true})");
    EXPECT_EQ(listener.codes(), "8/1 16/5 16/6 8/2");
    EXPECT_EQ(machine.query("{'query': 'time'}")["ms"].asInt(), 250);
    EXPECT_EQ(machine.ask("{'do': 'advance', 'ms': 50}"), R"({"ok":true})");
    EXPECT_EQ(times, "100 200 200 200 300 ");
}

TEST(MachineTime, AdvanceIsAnsweredWhenWhatItSetOffHasBeenDone) {
    TestMachine machine("{'timeline': [{'atMs': 10, 'do': 'notify', 'source': 8, 'code': 1}]}");
    Listener listener;
    listener.onNotification = [](const WLAN_NOTIFICATION_DATA&) {
        platform::sleepFor(std::chrono::milliseconds(500));
    };
    machine.ask("{'do': 'advance', 'ms': 10}");
    EXPECT_EQ(listener.codes(), "");
    machine.ask("{'do': 'advance', 'ms': 500}");
    EXPECT_EQ(listener.codes(), "8/1");
}

TEST(MachineTime, TheTimelineCanMoveTheClock) {
    TestMachine machine(
        "{'timeline': [{'atMs': 100, 'do': 'advance', 'ms': 400},"
        "{'atMs': 300, 'do': 'notify', 'source': 8, 'code': 1},"
        "{'atMs': 600, 'do': 'notify', 'source': 8, 'code': 2}]}");
    Listener listener;
    platform::Event told(platform::Reset::Manual);
    listener.onNotification = [&](const WLAN_NOTIFICATION_DATA&) { told.set(); };
    machine.advance(100);
    EXPECT_EQ(listener.codes(), "");
    told.wait();
    EXPECT_EQ(machine.query("{'query': 'time'}")["ms"].asInt(), 300);
    machine.advance(200);
    EXPECT_EQ(listener.codes(), "8/1");
    machine.advance(100);
    EXPECT_EQ(listener.codes(), "8/1 8/2");
}

TEST(MachineTime, ACorrectedClockMovesTimeStampsAlone) {
    TestMachine machine;
    const platform::Duration wall = platform::wallTime();
    const platform::Duration now = platform::now();
    machine.ask("{'do': 'shiftTime', 'ms': -3600000}");
    EXPECT_NEAR(milliseconds(platform::wallTime() - wall), -3600000, 1);
    EXPECT_EQ(platform::now(), now);
    machine.ask("{'do': 'shiftTime', 'ms': 3600000}");
    EXPECT_NEAR(milliseconds(platform::wallTime() - wall), 0, 1);
}

}  // namespace
}  // namespace vexa::simulation
