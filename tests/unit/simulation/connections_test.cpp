#include <gtest/gtest.h>

#include <algorithm>
#include <random>
#include <regex>

#include "Station.h"
#include "platform/Event.h"

namespace vexa::simulation {
namespace {

const std::string kScenario =
    "{'networks': ["
    "{'bssid': '02:00:00:00:00:01', 'ssid': 'Cafe', 'channel': 11, 'accepts': [{'eapMethod': 21}]},"
    "{'bssid': '02:00:00:00:00:02', 'ssid': 'Bar', 'channel': 100, 'accepts': [{'eapMethod': 21}]},"
    "{'bssid': '02:00:00:00:00:03', 'ssid': 'Own', 'osProfile': true}]}";
const std::string kHideCafe = "{'do': 'hide', 'bssid': '02:00:00:00:00:01'}";
const std::string kRadioOff = "{'do': 'radio', 'software': 'off'}";

const Texts kBegun = {"8/9 associating 0", "16/1 associating 0"};

Texts joined(const std::string& channel) {
    return {"16/2 associating 0", "16/3 authenticating 0", "16/4 connected " + channel,
            "8/10 connected " + channel};
}

Texts joinedBySystem(const std::string& channel) {
    return {"8/9 associating 0", "8/10 connected " + channel};
}

Texts refused(const std::string& reason) {
    return {"8/11 disconnected 0 " + reason, "8/10 disconnected 0 " + reason};
}

Texts dropped(const std::string& reason) {
    return {"8/20 disconnecting 11 " + reason, "16/10 disconnected 0", "8/21 disconnected 0 " + reason};
}

Texts left(const std::string& reason) {
    return {"8/20 disconnecting 11 " + reason, "16/9 disconnecting 11", "16/10 disconnected 0",
            "8/21 disconnected 0 " + reason};
}

void bring(Station& station, const std::string& state) {
    if (state == "idle") return;
    station.act(state == "pulled" ? "{'do': 'pullAdapter'}" : "connect Cafe");
    station.machine.advance(state == "joined" ? 200 : 100);
    station.told();
}

TEST(Connections, WhateverIsDoneHasItsCourse) {
    const Texts cancelled = {"8/10 disconnected 0 00038003"};
    const Texts lost = {"8/21 disconnected 0 00028003"};
    const struct {
        std::string before;
        std::string act;
        Texts told;
    } cases[] = {
        {"idle", "connect Cafe", kBegun + joined("11")},
        {"idle", "connect Far", kBegun + refused("00038002")},
        {"idle", "discover Own", kBegun + joined("36")},
        {"idle", "discover Cafe", kBegun + refused("00050007")},
        {"idle", "{'do': 'osConnect', 'ssid': 'Cafe'}", joinedBySystem("11")},
        {"idle",
         "{'do': 'osConnect', 'ssid': 'Nowhere', 'succeeds': false}",
         {"8/9 associating 0", "8/10 disconnected 0 00038002"}},
        {"idle", "disconnect", {}},
        {"idle", "{'do': 'dropConnection'}", {}},
        {"pulled", "{'do': 'insertAdapter'}", {"8/13 disconnected 0"}},
        {"joined", "connect Bar", left("00038003") + kBegun + joined("100")},
        {"joined", "{'do': 'osConnect', 'ssid': 'Bar'}", left("00038003") + joinedBySystem("100")},
        {"joined", "disconnect", left("00028002")},
        {"joined", "{'do': 'dropConnection'}", dropped("00028003")},
        {"joined", "{'do': 'dropConnection', 'reason': 5}", dropped("00000005")},
        {"joined", kHideCafe, dropped("00028003")},
        {"joined", "{'do': 'setNetwork', 'bssid': '02:00:00:00:00:01', 'visible': false}",
         dropped("00028003")},
        {"joined", "{'do': 'hide', 'bssid': '02:00:00:00:00:02'}", {}},
        {"joined", kRadioOff, Texts{"16/7 connected 11"} + lost},
        {"joined", "{'do': 'radio', 'hardware': 'off'}", Texts{"16/7 connected 11"} + lost},
        {"joined", "{'do': 'radio', 'software': 'on'}", {"16/7 connected 11"}},
        {"joined", "{'do': 'pullAdapter'}", lost + Texts{"8/14 gone"}},
        {"joined", "{'do': 'roam'}", {"16/5 connected 11", "16/6 connected 11"}},
        {"trying", "connect Cafe", cancelled + kBegun + joined("11")},
        {"trying", "{'do': 'osConnect', 'ssid': 'Cafe'}", cancelled + joinedBySystem("11")},
        {"trying", "disconnect", cancelled + Texts{"8/21 disconnected 0"}},
        {"trying", "{'do': 'dropConnection'}", joined("11")},
        {"trying", kHideCafe, refused("00038002")},
        {"trying", kRadioOff, Texts{"16/7 associating 0"} + cancelled},
        {"trying", "{'do': 'pullAdapter'}", cancelled + Texts{"8/14 gone"}},
    };
    for (const auto& [before, act, told] : cases) {
        Station station(kScenario);
        bring(station, before);
        station.act(act);
        station.machine.advance(1000);
        EXPECT_EQ(station.told(), told) << before << " " << act;
    }
}

TEST(Connections, NothingBeginsOnWhatIsHiddenOrOff) {
    Station station(kScenario);
    station.act(kHideCafe);
    station.act("connect Cafe");
    station.machine.advance(200);
    EXPECT_EQ(station.told(), kBegun + refused("00038002"));
    station.act(kRadioOff);
    station.act("{'do': 'osConnect', 'ssid': 'Bar'}");
    station.machine.advance(1000);
    EXPECT_EQ(station.told(), Texts{"16/7 disconnected 0"});
}

TEST(Connections, EachAttemptHasItsOwnTime) {
    Station station(kScenario);
    station.act("connect Cafe");
    EXPECT_EQ(station.told(), kBegun);
    station.machine.advance(199);
    EXPECT_EQ(station.told(), Texts{});
    station.act("{'do': 'set', 'connectMs': 70}");
    station.act("connect Cafe");
    station.told();
    station.machine.advance(69);
    EXPECT_EQ(station.told(), Texts{});
    station.machine.advance(1);
    EXPECT_EQ(station.told(), joined("11"));
}

TEST(Connections, TheStateIsAssociatingWhenTheRequestReturns) {
    // Before the station: its notification thread may still be in a wait that has just ended.
    platform::Event leave(platform::Reset::Manual);
    platform::Event entered(platform::Reset::Manual);
    Station station(kScenario);
    station.listener.onNotification = [&](const WLAN_NOTIFICATION_DATA&) {
        entered.set();
        leave.wait();
    };
    station.machine->notifications().post({64, 0, {}, {}, nullptr});
    entered.wait();
    station.act("connect Cafe");
    EXPECT_EQ(station.state(), "associating");
    leave.set();
}

TEST(Connections, TheServerLetsInWhatItAccepts) {
    const std::string machineMode = tlsProfile("Cafe", "43616665", "ab cd", "machine");
    const std::string userMode = tlsProfile("Cafe", "43616665", "ab cd", "machineOrUser");
    const std::string ttls = ttlsProfile("Cafe", "43616665", "ann", " s&lt;cret ");
    const struct {
        std::string accepts;
        std::string profile;
        bool isLetIn;
    } cases[] = {
        {"", ttls, false},
        {"{'eapMethod': 13}", ttls, false},
        {"{'eapMethod': 13}, {'eapMethod': 21}", ttls, true},
        {"{'eapMethod': 21, 'username': 'ann', 'password': ' s<cret '}", ttls, true},
        {"{'eapMethod': 21, 'username': 'Ann'}", ttls, false},
        {"{'eapMethod': 21, 'password': 's<cret'}", ttls, false},
        {"{'eapMethod': 21, 'username': 'ann', 'password': ''}", ttls, false},
        {"{'eapMethod': 13, 'caCert': 'ab cd'}", userMode, true},
        {"{'eapMethod': 13, 'caCert': 'ab'}", userMode, false},
        {"{'eapMethod': 13, 'authMode': 'machine'}", userMode, false},
        {"{'eapMethod': 13, 'authMode': 'machine'}", machineMode, true},
        {"{'eapMethod': 13, 'username': 'ann'}", userMode, false},
    };
    for (const auto& [accepts, profile, isLetIn] : cases) {
        Station station(kScenario);
        station.act("{'do': 'setNetwork', 'bssid': '02:00:00:00:00:01', 'accepts': [" + accepts + "]}");
        ASSERT_EQ(station.connect(profile), ERROR_SUCCESS) << accepts;
        station.machine.advance(200);
        EXPECT_EQ(station.told(), kBegun + (isLetIn ? joined("11") : refused("00050007"))) << accepts;
    }
}

/// A letter for each notification of an attempt's or a connection's course.
std::string letterOf(const std::string& line) {
    const std::string code = line.substr(0, line.find(' '));
    if (code == "8/9") return "b";   // it begins
    if (code == "8/14") return "p";  // the adapter is pulled
    if (code == "8/20") return "d";  // disconnecting
    if (code == "8/21") return "e";  // it ends
    if (code != "8/10") return "";
    return std::count(line.begin(), line.end(), ' ') == 3 ? "c" : "j";  // cancelled, or joined
}

// Requests may be refused: the radio is off, or the adapter gone.
void doSomething(Station& station, std::size_t choice) {
    static const std::string kActions[] = {kHideCafe,
                                           "{'do': 'show', 'bssid': '02:00:00:00:00:01'}",
                                           kRadioOff,
                                           "{'do': 'radio', 'software': 'on'}",
                                           "{'do': 'pullAdapter'}",
                                           "{'do': 'insertAdapter'}",
                                           "{'do': 'osConnect', 'ssid': 'Cafe'}",
                                           "{'do': 'osConnect', 'ssid': 'Own', 'succeeds': false}",
                                           "{'do': 'dropConnection'}",
                                           "{'do': 'set', 'connectMs': 50}"};
    if (choice < std::size(kActions)) return station.act(kActions[choice]);
    if (choice == 10) station.connect(ttlsProfile("Cafe", "43616665"));
    if (choice == 11) station.connect(tlsProfile("Cafe", "43616665", "ca", "machine"));
    if (choice == 12) station.discover("Own");
    if (choice == 13) station.disconnect();
}

TEST(Connections, WhateverHappensEachAttemptHasOneEndAndEachConnectionToo) {
    const std::regex inOrder("(p|bce?|bjd?e)*(bj?)?");
    for (std::uint32_t seed = 0; seed < 60; ++seed) {
        std::mt19937 random(seed);
        Station station(kScenario);
        std::string course;
        for (int step = 0; step < 80; ++step) {
            // Often several requests before anything has been told.
            do {
                doSomething(station, random() % 14);
            } while (random() % 3 == 0);
            station.machine.advance(static_cast<int>(random() % 3 * 60));
            for (const std::string& line : station.told())
                course += letterOf(line);
            const std::string state = station.state();
            ASSERT_EQ(state == "connected", course.ends_with('j')) << "seed " << seed << " " << course;
            ASSERT_EQ(state == "associating", course.ends_with('b')) << "seed " << seed << " " << course;
        }
        EXPECT_TRUE(std::regex_match(course, inOrder)) << "seed " << seed << " " << course;
    }
}

TEST(Connections, AHandlerMayConnectAgain) {
    Station station(kScenario);
    int times = 0;
    station.listener.onNotification = [&](const WLAN_NOTIFICATION_DATA& data) {
        const bool isResult = data.NotificationSource == 8 && data.NotificationCode == 10;
        if (isResult && ++times < 3) station.act("connect Cafe");
    };
    station.act("connect Far");
    station.machine.advance(200);
    EXPECT_EQ(station.state(), "associating");
    station.machine.advance(200);
    EXPECT_EQ(station.listener.codes(),
              "8/9 16/1 8/11 8/10 8/9 16/1 16/2 16/3 16/4 8/10 8/20 16/9 16/10 8/21 8/9 16/1");
    EXPECT_EQ(times, 2);
}

TEST(Connections, TheFirstVisibleNetworkOfAnSsidIsMeant) {
    const std::string open = "'ssid': 'Cafe', 'accepts': [{'eapMethod': 21}]}";
    Station station("{'networks': [{'bssid': '02:00:00:00:00:01', 'visible': false, " + open +
                    ", {'bssid': '02:00:00:00:00:02', 'channel': 1, " + open +
                    ", {'bssid': '02:00:00:00:00:03', 'channel': 6, " + open + "]}");
    station.act("connect Cafe");
    station.machine.advance(200);
    station.act("{'do': 'hide', 'bssid': '02:00:00:00:00:03'}");
    EXPECT_EQ(station.told(), kBegun + joined("1"));
}

TEST(Connections, AnAdapterThatTakesOverTheModulesEndsTheConnectionOfTheOther) {
    Station station(
        "{'adapters': [{'hardwareId': null}, {'inserted': false}, {}], 'networks': [{'bssid': "
        "'02:00:00:00:00:01', 'ssid': 'Cafe'}]}");
    station.act("{'do': 'osConnect', 'ssid': 'Cafe', 'succeeds': true}");
    station.machine.advance(200);
    EXPECT_EQ(station.state(), "connected");
    station.act("{'do': 'insertAdapter', 'adapter': 1}");
    EXPECT_EQ(station.listener.codes(), "8/9 8/10 8/21 8/13");
    EXPECT_EQ(station.state(), "disconnected");
}

}  // namespace
}  // namespace vexa::simulation
