#include <gtest/gtest.h>

#include <functional>

#include "Station.h"
#include "simulation/JsonText.h"

namespace vexa::simulation {
namespace {

const std::string kCafe = "43616665";
const std::string kBar = "426172";

const std::string kScenario =
    "{'networks': ["
    "{'bssid': '02:00:00:00:00:01', 'ssid': 'Cafe', 'channel': 11, 'accepts': [{'eapMethod': 21}]},"
    "{'bssid': '02:00:00:00:00:02', 'ssid': 'Bar', 'channel': 100, 'accepts': [{'eapMethod': 21}]},"
    "{'bssid': '02:00:00:00:00:03', 'ssid': 'Own', 'osProfile': true}]}";

const Told kBegun = {"8/9 associating 0", "16/1 associating 0"};
const Told kAccepted = {"16/2 associating 0", "16/3 authenticating 0", "16/4 connected 11",
                        "8/10 connected 11"};

std::string cafeProfile(const std::string& username = "u") {
    return ttlsProfile("Cafe", kCafe, username, "p");
}

Told refusedWith(const std::string& reason) {
    return {"8/11 disconnected 0 " + reason, "8/10 disconnected 0 " + reason};
}

TEST(Connections, ARequestThatIsAcceptedGoesThroughAllStates) {
    Station station(kScenario);
    EXPECT_EQ(station.connect(cafeProfile()), ERROR_SUCCESS);
    EXPECT_EQ(station.state(), "associating");
    EXPECT_EQ(station.told(), kBegun);
    station.machine.advance(199);
    EXPECT_EQ(station.told(), Told{});
    station.machine.advance(1);
    EXPECT_EQ(station.told(), kAccepted);
    station.machine.advance(10000);
    EXPECT_EQ(station.told(), Told{});
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
    EXPECT_EQ(station.connect(cafeProfile()), ERROR_SUCCESS);
    EXPECT_EQ(station.state(), "associating");
    leave.set();
}

TEST(Connections, TheServerLetsInWhatItAccepts) {
    const std::string machineMode = tlsProfile("Cafe", kCafe, "ab cd", "machine");
    const std::string userMode = tlsProfile("Cafe", kCafe, "ab cd", "machineOrUser");
    const std::string ttls = ttlsProfile("Cafe", kCafe, "ann", " s&lt;cret ");
    const struct {
        const char* accepts;
        std::string profile;
        bool isLetIn;
    } cases[] = {
        {"", ttls, false},
        {"{'eapMethod': 21}", ttls, true},
        {"{'eapMethod': 13}", ttls, false},
        {"{'eapMethod': 13}, {'eapMethod': 21}", ttls, true},
        {"{'eapMethod': 21, 'username': 'ann', 'password': ' s<cret '}", ttls, true},
        {"{'eapMethod': 21, 'username': 'Ann'}", ttls, false},
        {"{'eapMethod': 21, 'password': 's<cret'}", ttls, false},
        {"{'eapMethod': 21, 'username': 'ann', 'password': ''}", ttls, false},
        {"{'eapMethod': 21, 'authMode': 'machineOrUser'}", ttls, true},
        {"{'eapMethod': 21, 'authMode': 'machine'}", ttls, false},
        {"{'eapMethod': 13}", userMode, true},
        {"{'eapMethod': 21}", userMode, false},
        {"{'eapMethod': 13, 'caCert': 'ab cd'}", userMode, true},
        {"{'eapMethod': 13, 'caCert': 'ab'}", userMode, false},
        {"{'eapMethod': 13, 'authMode': 'machine'}", userMode, false},
        {"{'eapMethod': 13, 'authMode': 'machine'}", machineMode, true},
        {"{'eapMethod': 13, 'username': 'ann'}", userMode, false},
    };
    for (const auto& [accepts, profile, isLetIn] : cases) {
        Station station(
            "{'networks': [{'bssid': '02:00:00:00:00:01', 'ssid': 'Cafe', 'channel': 11, 'accepts': [" +
            std::string(accepts) + "]}]}");
        ASSERT_EQ(station.connect(profile), ERROR_SUCCESS) << accepts;
        station.machine.advance(200);
        EXPECT_EQ(station.told(), kBegun + (isLetIn ? kAccepted : refusedWith("00050007"))) << accepts;
    }
}

TEST(Connections, ANetworkThatIsNotThereRefuses) {
    Station station(kScenario);
    station.connect(ttlsProfile("Far", "466172", "u", "p"));
    station.machine.advance(200);
    EXPECT_EQ(station.told(), kBegun + refusedWith("00038002"));
    station.perform("{'do': 'hide', 'bssid': '02:00:00:00:00:01'}");
    station.connect(cafeProfile());
    station.machine.advance(200);
    EXPECT_EQ(station.told(), kBegun + refusedWith("00038002"));
}

TEST(Connections, ANetworkThatGoesDuringTheAttemptRefuses) {
    Station station(kScenario);
    station.connect(cafeProfile());
    station.perform("{'do': 'hide', 'bssid': '02:00:00:00:00:01'}");
    station.machine.advance(200);
    EXPECT_EQ(station.told(), kBegun + refusedWith("00038002"));
}

TEST(Connections, DiscoveryFollowsTheSystemsOwnProfiles) {
    Station station(kScenario);
    EXPECT_EQ(station.discover("Own"), ERROR_SUCCESS);
    station.machine.advance(200);
    EXPECT_EQ(station.told(), (kBegun + Told{"16/2 associating 0", "16/3 authenticating 0",
                                             "16/4 connected 36", "8/10 connected 36"}));
    station.disconnect();
    station.told();
    EXPECT_EQ(station.discover("Cafe"), ERROR_SUCCESS);
    station.machine.advance(200);
    EXPECT_EQ(station.told(), kBegun + refusedWith("00050007"));
}

using Act = std::function<void(Station&)>;

Act performing(const std::string& action) {
    return [action](Station& station) { station.perform(action); };
}

TEST(Connections, EveryEndOfAConnectionHasItsOwnCourse) {
    const Told dropped = {"8/20 disconnecting 11 00028003", "16/10 disconnected 0",
                          "8/21 disconnected 0 00028003"};
    const Told overtaken = Told{"8/20 disconnecting 11 00038003", "16/9 disconnecting 11",
                                "16/10 disconnected 0", "8/21 disconnected 0 00038003"};
    const struct {
        const char* name;
        Act act;
        Told told;
    } cases[] = {
        {"disconnect",
         [](Station& s) { EXPECT_EQ(s.disconnect(), ERROR_SUCCESS); },
         {"8/20 disconnecting 11 00028002", "16/9 disconnecting 11", "16/10 disconnected 0",
          "8/21 disconnected 0 00028002"}},
        {"drop", performing("{'do': 'dropConnection'}"), dropped},
        {"drop for a reason",
         performing("{'do': 'dropConnection', 'reason': 5}"),
         {"8/20 disconnecting 11 00000005", "16/10 disconnected 0", "8/21 disconnected 0 00000005"}},
        {"hide", performing("{'do': 'hide', 'bssid': '02:00:00:00:00:01'}"), dropped},
        {"hide by another way",
         performing("{'do': 'setNetwork', 'bssid': '02:00:00:00:00:01', 'visible': false}"), dropped},
        {"hide another", performing("{'do': 'hide', 'bssid': '02:00:00:00:00:02'}"), {}},
        {"radio off",
         performing("{'do': 'radio', 'software': 'off'}"),
         {"16/7 connected 11", "8/21 disconnected 0 00028003"}},
        {"radio off by hand",
         performing("{'do': 'radio', 'hardware': 'off'}"),
         {"16/7 connected 11", "8/21 disconnected 0 00028003"}},
        {"radio still on", performing("{'do': 'radio', 'software': 'on'}"), {"16/7 connected 11"}},
        {"pull", performing("{'do': 'pullAdapter'}"), {"8/21 disconnected 0 00028003", "8/14 gone"}},
        {"request", [](Station& s) { s.connect(ttlsProfile("Bar", kBar, "u", "p")); }, overtaken + kBegun},
        {"system", performing("{'do': 'osConnect', 'ssid': 'Bar'}"), overtaken + Told{"8/9 associating 0"}},
        {"roam", performing("{'do': 'roam'}"), {"16/5 connected 11", "16/6 connected 11"}},
    };
    for (const auto& [name, act, told] : cases) {
        Station station(kScenario);
        station.join(kCafe);
        act(station);
        EXPECT_EQ(station.told(), told) << name;
    }
}

TEST(Connections, EveryEndOfAnAttemptHasItsOwnCourse) {
    const Told cancelled = {"8/10 disconnected 0 00038003"};
    const struct {
        const char* name;
        Act act;
        Told told;
    } cases[] = {
        {"disconnect",
         [](Station& s) { s.disconnect(); },
         {"8/10 disconnected 0 00038003", "8/21 disconnected 0"}},
        {"radio off",
         performing("{'do': 'radio', 'software': 'off'}"),
         {"16/7 associating 0", "8/10 disconnected 0 00038003"}},
        {"pull", performing("{'do': 'pullAdapter'}"), {"8/10 disconnected 0 00038003", "8/14 gone"}},
        {"request", [](Station& s) { s.connect(cafeProfile()); }, cancelled + kBegun + kAccepted},
        {"system", performing("{'do': 'osConnect', 'ssid': 'Cafe'}"),
         cancelled + Told{"8/9 associating 0", "8/10 connected 11"}},
        {"drop", performing("{'do': 'dropConnection'}"), kAccepted},
    };
    for (const auto& [name, act, told] : cases) {
        Station station(kScenario);
        station.connect(cafeProfile());
        station.told();
        station.machine.advance(100);
        act(station);
        station.machine.advance(1000);
        EXPECT_EQ(station.told(), told) << name;
    }
}

TEST(Connections, WhatIsNotThereEndsWithoutAWord) {
    Station station(kScenario);
    EXPECT_EQ(station.disconnect(), ERROR_SUCCESS);
    station.perform("{'do': 'dropConnection'}");
    EXPECT_EQ(station.told(), Told{});
}

TEST(Connections, AnotherAttemptHasItsOwnTime) {
    Station station(kScenario);
    station.connect(cafeProfile());
    station.machine.advance(150);
    station.perform("{'do': 'set', 'connectMs': 70}");
    station.connect(cafeProfile());
    station.told();
    station.machine.advance(69);
    EXPECT_EQ(station.told(), Told{});
    station.machine.advance(1);
    EXPECT_EQ(station.told(), kAccepted);
}

TEST(Connections, TheSystemConnectsByItself) {
    Station station(kScenario);
    station.perform("{'do': 'osConnect', 'ssid': 'Cafe'}");
    station.machine.advance(200);
    EXPECT_EQ(station.told(), (Told{"8/9 associating 0", "8/10 connected 11"}));
    station.disconnect();
    station.told();
    station.perform("{'do': 'osConnect', 'ssid': 'Nowhere', 'succeeds': false}");
    station.machine.advance(200);
    EXPECT_EQ(station.told(), (Told{"8/9 associating 0", "8/10 disconnected 0 00038002"}));
}

TEST(Connections, TheSystemLeavesAnAdapterThatIsOffAlone) {
    Station station(kScenario);
    station.perform("{'do': 'radio', 'software': 'off'}");
    station.told();
    station.perform("{'do': 'osConnect', 'ssid': 'Cafe'}");
    station.machine.advance(1000);
    EXPECT_EQ(station.told(), Told{});
}

TEST(Connections, AHandlerMayConnectAgain) {
    Station station(kScenario);
    int times = 0;
    station.listener.onNotification = [&](const WLAN_NOTIFICATION_DATA& data) {
        const bool isResult = data.NotificationSource == 8 && data.NotificationCode == 10;
        if (isResult && ++times < 3) station.connect(cafeProfile());
    };
    station.connect(ttlsProfile("Far", "466172", "u", "p"));
    station.machine.advance(200);
    EXPECT_EQ(station.state(), "associating");
    station.machine.advance(200);
    EXPECT_EQ(station.listener.codes(),
              "8/9 16/1 8/11 8/10 8/9 16/1 16/2 16/3 16/4 8/10 8/20 16/9 16/10 8/21 8/9 16/1");
    EXPECT_EQ(times, 2);
}

TEST(Connections, TheFirstVisibleNetworkOfAnSsidIsMeant) {
    Station station(
        "{'networks': [{'bssid': '02:00:00:00:00:01', 'ssid': 'Cafe', 'visible': false, 'accepts': "
        "[{'eapMethod': 21}]},"
        "{'bssid': '02:00:00:00:00:02', 'ssid': 'Cafe', 'channel': 1, 'accepts': [{'eapMethod': 21}]},"
        "{'bssid': '02:00:00:00:00:03', 'ssid': 'Cafe', 'channel': 6}]}");
    station.join(kCafe);
    Bytes channel;
    EXPECT_EQ(station.query(wlan_intf_opcode_channel_number, channel), ERROR_SUCCESS);
    EXPECT_EQ(hexText(channel), "01000000");
    station.perform("{'do': 'hide', 'bssid': '02:00:00:00:00:03'}");
    EXPECT_EQ(station.told(), Told{});
}

TEST(Connections, AnAdapterThatTakesOverTheModulesEndsTheConnectionOfTheOther) {
    Station station(
        "{'adapters': [{'hardwareId': null}, {'inserted': false}, {}], 'networks': [{'bssid': "
        "'02:00:00:00:00:01', 'ssid': 'Cafe', 'accepts': [{'eapMethod': 21}]}]}");
    station.perform("{'do': 'osConnect', 'ssid': 'Cafe'}");
    station.machine.advance(200);
    EXPECT_EQ(station.state(), "connected");
    station.perform("{'do': 'insertAdapter', 'adapter': 1}");
    EXPECT_EQ(station.listener.codes(), "8/9 8/10 8/21 8/13");
    EXPECT_EQ(station.state(), "disconnected");
}

}  // namespace
}  // namespace vexa::simulation
