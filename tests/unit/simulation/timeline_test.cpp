#include <gtest/gtest.h>

#include "Station.h"
#include "platform/Event.h"

namespace vexa::simulation {
namespace {

TEST(Timeline, AdvanceDeliversInTheOrderInWhichThingsAreDue) {
    Station station(
        "{'timeline': [{'atMs': 300, 'do': 'notify', 'source': 8, 'code': 3},"
        "{'atMs': 100, 'do': 'notify', 'source': 8, 'code': 1},"
        "{'atMs': 200, 'do': 'roam'}, {'atMs': 200, 'do': 'notify', 'source': 8, 'code': 2}]}");
    std::string times;
    station.listener.onNotification = [&](const WLAN_NOTIFICATION_DATA&) {
        times += std::to_string(station.machine->elapsed().count() / 1000) + " ";
    };
    station.act("{'do': 'advance', 'ms': 250}");
    EXPECT_EQ(station.listener.codes(), "8/1 16/5 16/6 8/2");
    EXPECT_EQ(station.machine.query("{'query': 'time'}")["ms"].asInt(), 250);
    station.act("{'do': 'advance', 'ms': 50}");
    EXPECT_EQ(times, "100 200 200 200 300 ");
}

TEST(Timeline, ActsAtZeroBeforeTheMachineIsThere) {
    TestMachine machine(
        "{'timeline': [{'atMs': 0, 'do': 'pullAdapter'}, {'atMs': 0, 'do': 'show', 'bssid': "
        "'02:00:00:00:00:01'},"
        "{'atMs': 100, 'do': 'insertAdapter'}]}");
    EXPECT_TRUE(machine->adapters().inserted().empty());
    machine.advance(100);
    EXPECT_EQ(machine->adapters().inserted().size(), 1U);
}

TEST(Timeline, AnAdvanceIsAnsweredWhenWhatItSetOffHasBeenDone) {
    Station station("{'timeline': [{'atMs': 10, 'do': 'notify', 'source': 8, 'code': 1}]}");
    station.listener.onNotification = [](const WLAN_NOTIFICATION_DATA&) {
        platform::sleepFor(std::chrono::milliseconds(500));
    };
    station.act("{'do': 'advance', 'ms': 10}");
    EXPECT_EQ(station.listener.codes(), "");
    station.act("{'do': 'advance', 'ms': 500}");
    EXPECT_EQ(station.listener.codes(), "8/1");
}

TEST(Timeline, CanMoveTheClockAndCorrectIt) {
    platform::Event told(platform::Reset::Manual);
    Station station(
        "{'timeline': [{'atMs': 100, 'do': 'advance', 'ms': 400},"
        "{'atMs': 300, 'do': 'notify', 'source': 8, 'code': 1},"
        "{'atMs': 400, 'do': 'shiftTime', 'ms': -3600000},"
        "{'atMs': 600, 'do': 'notify', 'source': 8, 'code': 2}]}");
    station.listener.onNotification = [&](const WLAN_NOTIFICATION_DATA&) { told.set(); };
    const auto lead = [start = platform::wallTime() - platform::now()] {
        return static_cast<double>((platform::wallTime() - platform::now() - start).count()) / 1000;
    };
    station.machine.advance(100);
    EXPECT_EQ(station.listener.codes(), "");
    told.wait();
    EXPECT_EQ(station.machine.query("{'query': 'time'}")["ms"].asInt(), 300);
    station.machine.advance(200);
    EXPECT_EQ(station.listener.codes(), "8/1");
    station.machine.advance(100);
    EXPECT_EQ(station.listener.codes(), "8/1 8/2");
    EXPECT_NEAR(lead(), -3600000, 1);
    station.act("{'do': 'shiftTime', 'ms': 3600000}");
    EXPECT_NEAR(lead(), 0, 1);
}

}  // namespace
}  // namespace vexa::simulation
