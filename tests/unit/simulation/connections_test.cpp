#include <gtest/gtest.h>

#include "Station.h"
#include "platform/Event.h"

namespace vexa::simulation {
namespace {

const std::string kScenario =
    "{'networks': ["
    "{'bssid': '02:00:00:00:00:01', 'ssid': 'Cafe', 'channel': 11, 'accepts': [{'eapMethod': 21}]},"
    "{'bssid': '02:00:00:00:00:04', 'ssid': 'Bar', 'visible': false},"
    "{'bssid': '02:00:00:00:00:02', 'ssid': 'Bar', 'channel': 100, 'accepts': [{'eapMethod': 21}]},"
    "{'bssid': '02:00:00:00:00:05', 'ssid': 'Bar', 'channel': 6},"
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

// To one of these states, or to where an action leads.
void bring(Station& station, const std::string& state) {
    if (state == "idle") return;
    station.act(state == "joined" || state == "trying" ? "connect Cafe" : state);
    station.machine.advance(state == "joined" ? 200 : 100);
    station.told();
}

TEST(Connections, WhateverIsDoneHasItsCourse) {
    const Texts cancelled = {"8/10 disconnected 0 00038003"};
    const Texts failed = {"8/9 associating 0", "8/10 disconnected 0 00038002"};
    const Texts lost = {"8/21 disconnected 0 00028003"};
    const std::tuple<std::string, std::string, Texts> cases[] = {
        {"idle", "connect Cafe", kBegun + joined("11")},
        {"idle", "connect Far", kBegun + refused("00038002")},
        {"idle", "discover Own", kBegun + joined("36")},
        {"idle", "discover Cafe", kBegun + refused("00050007")},
        {"idle", "{'do': 'osConnect', 'ssid': 'Cafe'}", joinedBySystem("11")},
        {"idle", "{'do': 'osConnect', 'ssid': 'Nowhere', 'succeeds': false}", failed},
        {"idle", "disconnect", {}},
        {"idle", "{'do': 'dropConnection'}", {}},
        {"{'do': 'pullAdapter'}", "{'do': 'insertAdapter'}", {"8/13 disconnected 0"}},
        {kHideCafe, "connect Cafe", kBegun + refused("00038002")},
        {kRadioOff, "{'do': 'osConnect', 'ssid': 'Bar'}", {}},
        {"connect Bar", "{'do': 'hide', 'bssid': '02:00:00:00:00:05'}", joined("100")},
        {"joined", "connect Bar", left("00038003") + kBegun + joined("100")},
        {"joined", "{'do': 'osConnect', 'ssid': 'Bar'}", left("00038003") + joinedBySystem("100")},
        {"joined", "disconnect", left("00028002")},
        {"joined", "{'do': 'dropConnection'}", dropped("00028003")},
        {"joined", "{'do': 'dropConnection', 'reason': 5}", dropped("00000005")},
        {"joined", kHideCafe, dropped("00028003")},
        {"joined", "{'do':'setNetwork', 'bssid':'02:00:00:00:00:01', 'visible':false}", dropped("00028003")},
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
    const std::tuple<std::string, std::string, bool> cases[] = {
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

}  // namespace
}  // namespace vexa::simulation
