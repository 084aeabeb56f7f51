#include <gtest/gtest.h>

#include "Station.h"
#include "platform/Event.h"
#include "simulation/scenario/JsonText.h"

namespace vexa::simulation {
namespace {

TEST(Actions, WhatIsNotUnderstoodIsRefusedWithAReason) {
    TestMachine machine("{'networks': [{'bssid': '02:00:00:00:00:01', 'ssid': 'Cafe'}]}");
    const std::pair<std::string, const char*> cases[] = {
        {"[]", "not an object"},
        {"{}", "do: missing"},
        {"{'do': 5}", "do: not a text"},
        {"{'do': 'noSuchAction'}", "do: unknown action noSuchAction"},
        {"{'do': 'roam', 'atMs': 5}", "atMs: unknown member"},
        {"{'do': 'advance'}", "ms: missing"},
        {"{'do': 'advance', 'ms': -1}", "ms: negative"},
        {"{'do': 'interfaceState', 'value': 8}", "value: not from 0 to 7"},
        {"{'do': 'pullAdapter', 'adapter': 1}", "adapter: no such adapter"},
        {"{'do': 'fail', 'call': 'WlanDance', 'error': 5}", "call: no call that can fail"},
        {"{'do': 'fail', 'call': 'WlanIhvControl', 'error': 5, 'match': 'scans'}", "match: no IHV request"},
        {"{'do': 'fail', 'call': 'open', 'error': 5, 'match': 5}", "match: not a text"},
        {"{'do': 'levels', 'levels': {}}", "levels: the machine has no spectrum"},
        {"{'do': 'set', 'scanMs': 5}", "scanMs: the machine has no spectrum"},
        {"{'do': 'show', 'bssid': '02:00:00:00:00:09'}", "bssid: no such network"},
        {"{'do': 'setNetwork', 'bssid': '02:00:00:00:00:09'}", "bssid: no such network"},
        {"{'do': 'setNetwork', 'hs20': true}", "bssid: missing"},
        {"{'do': 'setNetwork', 'bssid': '02:00:00:00:00:01', 'hs20': 1}", "hs20: not a boolean"},
        {"{'do': 'addNetwork', 'network': {'bssid': '02:00:00:00:00:01', 'ssid': 'New'}}",
         "network.bssid: is there already"},
        {"{'do': 'userDisconnect', 'ssid': '" + std::string(33, 'x') + "'}", "ssid: more than 32 bytes"},
        {"{'do': 'osConnect', 'ssid': ''}", "ssid: empty"},
        {"{'do': 'connection', 'code': 10, 'ssidHex': '" + zeros(33) + "'}", "ssidHex: more than 32 bytes"},
        {"{'query': 'weather'}", "query: unknown query weather"},
        {"{'query': 'time', 'all': true}", "all: unknown member"},
        {"{'query': 'calls', 'all': 1}", "all: not a boolean"},
    };
    const auto refusal = [](const std::string& error) {
        return R"({"error":")" + error + R"(","ok":false})";
    };
    for (const auto& [message, error] : cases)
        EXPECT_EQ(machine.ask(message), refusal(error)) << message;
    machine.perform("{'do': 'userDisconnect', 'ssid': '" + std::string(32, 'x') + "'}");
}

TEST(Actions, AMachineWithoutAdaptersRefusesWhatNeedsOne) {
    TestMachine machine("{'adapters': []}");
    EXPECT_EQ(machine.ask("{'do': 'pullAdapter'}"), R"({"error":"adapter: no such adapter","ok":false})");
    EXPECT_EQ(machine.ask("{'do': 'radio'}"), R"({"error":"adapter: the machine has none","ok":false})");
    machine.perform("{'do': 'notify', 'source': 8, 'code': 1}");
}

TEST(Actions, RadioChangesTheStateBeforeItsNotification) {
    Station station;
    std::string seen;
    station.listener.onNotification = [&](const WLAN_NOTIFICATION_DATA&) {
        Bytes state;
        ASSERT_EQ(station.query(wlan_intf_opcode_radio_state, state), ERROR_SUCCESS);
        seen = at(state, 0, 16);
    };
    station.act("{'do': 'radio', 'software': 'off'}");
    EXPECT_EQ(seen, hex("01000000 00000000 02000000 01000000"));
    station.act("{'do': 'radio', 'hardware': 'unknown'}");
    EXPECT_EQ(seen, hex("01000000 00000000 02000000 00000000"));
    station.act("{'do': 'radio'}");
    EXPECT_EQ(station.listener.codes(), "16/7 16/7 16/7");
    EXPECT_EQ(hexText(station.listener.heard()[1].data), hex("00000000 02000000 00000000"));
    EXPECT_EQ(compactJson(station.machine.query("{'query': 'interface'}")),
              R"({"radio":{"hardware":"unknown","software":"off"},"ssid":null,"state":"disconnected"})");
}

TEST(Actions, TheModulesAndTheConnectionAreThoseOfTheMakersFirstAdapter) {
    Station station(
        "{'adapters': [{'hardwareId': 'pci\\\\ven_8086'}, {'hardwareId': 'USB\\\\VID_2B7E&PID_1'}, {}]}");
    const auto served = [&] { return station.machine->adapters().served(); };
    EXPECT_EQ(served(), 1U);
    station.act("{'do': 'pullAdapter', 'adapter': 1}");
    EXPECT_EQ(served(), 2U);
    station.act("{'do': 'pullAdapter', 'adapter': 2}");
    EXPECT_EQ(served(), std::nullopt);
    station.act("{'do': 'insertAdapter', 'adapter': 2}");
    station.act("{'do': 'osConnect', 'ssid': 'Cafe'}");
    station.machine.advance(200);
    EXPECT_EQ(station.state(), "connected");
    station.act("{'do': 'insertAdapter', 'adapter': 1}");
    EXPECT_EQ(served(), 1U);
    EXPECT_EQ(station.state(), "disconnected");
    EXPECT_EQ(station.listener.codes(), "8/14 8/14 8/13 8/9 8/10 8/21 8/13");
}

TEST(Timeline, CanMoveTheClockAndCorrectIt) {
    platform::Event told(platform::Reset::Manual);
    Station station(
        "{'timeline': [{'atMs': 100, 'do': 'advance', 'ms': 400},"
        "{'atMs': 300, 'do': 'notify', 'source': 8, 'code': 3},"
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
    EXPECT_EQ(station.listener.codes(), "8/3 8/1");
    station.machine.advance(100);
    EXPECT_EQ(station.listener.codes(), "8/3 8/1 8/2");
    EXPECT_NEAR(lead(), -3600000, 1);
    station.act("{'do': 'shiftTime', 'ms': 3600000}");
    EXPECT_NEAR(lead(), 0, 1);
}

}  // namespace
}  // namespace vexa::simulation
