#include "simulation/Scenario.h"

#include <gtest/gtest.h>

#include <algorithm>

#include "simulation/DemoScenario.h"

namespace vexa::simulation {
namespace {

std::string quoted(std::string text) {
    std::replace(text.begin(), text.end(), '\'', '"');
    return text;
}

Scenario scenario(const std::string& text) {
    return parseScenario(quoted(text));
}

std::string faultOf(const std::string& text) {
    try {
        scenario(text);
    } catch (const JsonFault& fault) {
        return fault.what();
    }
    return "no fault";
}

TEST(Scenario, AFaultNamesTheMember) {
    struct Case {
        std::string text;
        const char* fault;
    };
    const Case cases[] = {
        {"[]", "scenario: not an object"},
        {"{'foo': 1}", "foo: unknown member"},
        {"{'speed': 'fast'}", "speed: not a number"},
        {"{'speed': -1}", "speed: not from 0 to 1000000"},
        {"{'seed': 1.5}", "seed: not a whole number"},
        {"{'user': null}", "user: not a text"},
        {"{'session': 'asleep'}", "session: not one of active, disconnected"},
        {"{'hotspotAutoConnect': true}", "hotspotAutoConnect: not a text"},
        {"{'config': {}}", "config: not a text"},
        {"{'connectMs': -5}", "connectMs: negative"},
        {"{'adapters': {}}", "adapters: not an array"},
        {"{'adapters': [{'guid': 'x'}]}", "adapters[0].guid: not a GUID"},
        {"{'adapters': [{}, {'mac': '02:1f:5d'}]}", "adapters[1].mac: not a MAC address"},
        {"{'adapters': [{'hardwareRadio': 'loud'}]}",
         "adapters[0].hardwareRadio: not one of on, off, unknown"},
        {"{'adapters': [{'dns': ['192.0.2.1', 2]}]}", "adapters[0].dns[1]: not a text"},
        {"{'adapters': [{'inserted': 1}]}", "adapters[0].inserted: not a boolean"},
        {"{'registryClass': [{'guid': 'x'}]}", "registryClass[0].guid: unknown member"},
        {"{'networks': [{'ssid': 'a'}]}", "networks[0].bssid: missing"},
        {"{'networks': [{'bssid': '02:00:00:00:00:01'}]}", "networks[0].ssid: missing"},
        {"{'networks': [{'bssid': '02:00:00:00:00:01', 'ssid': ''}]}", "networks[0].ssid: not 1 to 32 bytes"},
        {"{'networks': [{'bssid': '02:00:00:00:00:01', 'ssid': 'a', 'ssidHex': '61'}]}",
         "networks[0].ssidHex: not together with ssid"},
        {"{'networks': [{'bssid': '02:00:00:00:00:01', 'ssid': 'a', 'realms': [], 'naiRealmHex': ''}]}",
         "networks[0].naiRealmHex: not together with realms"},
        {"{'networks': [{'bssid': '02:00:00:00:00:01', 'ssidHex': '0'}]}", "networks[0].ssidHex: not hex"},
        {"{'networks': [{'bssid': '02:00:00:00:00:01', 'ssid': 'a'}, {'bssid': '02:00:00:00:00:02', 'ssid': "
         "'b'},"
         "{'bssid': '02:00:00:00:00:03', 'ssid': 'c', 'realms': [{'names': ['r'], 'eapMethods': 13}]}]}",
         "networks[2].realms[0].eapMethods: not an array"},
        {"{'networks': [{'bssid': '02:00:00:00:00:01', 'ssid': 'a', 'realms': [{'names': ['" +
             std::string(128, 'x') + "', '" + std::string(127, 'x') + "']}]}]}",
         "networks[0].realms[0].names: more than 255 bytes"},
        {"{'networks': [{'bssid': '02:00:00:00:00:01', 'ssid': 'a', 'anqp': 'soon'}]}",
         "networks[0].anqp: not one of ready, onQuery, never"},
        {"{'networks': [{'bssid': '02:00:00:00:00:01', 'ssid': 'a', 'accepts': [{'eapMethod': 25}]}]}",
         "networks[0].accepts[0].eapMethod: not one of 13, 21"},
        {"{'spectrum': []}", "spectrum: not an object"},
        {"{'spectrum': {'scanMs': 'x'}}", "spectrum.scanMs: not a number"},
        {"{'spectrum': {'channels': [1, 256]}}", "spectrum.channels[1]: not from 0 to 255"},
        {"{'spectrum': {'levels': {'one': {}}}}", "spectrum.levels.one: not a channel number"},
        {"{'spectrum': {'levels': {'1': {'spread': -1}}}}", "spectrum.levels.1.spread: not from 0 to 65535"},
        {"{'spectrum': {'scans': [[{'bins': [1, 2]}]]}}", "spectrum.scans[0][0].bins: not 56 bins"},
        {"{'timeline': [{'do': 'roam'}]}", "timeline[0].atMs: missing"},
        {"{'timeline': [{'atMs': 1}]}", "timeline[0].do: missing"},
        {"{'timeline': [{'atMs': 1, 'do': 'dance'}]}", "timeline[0].do: unknown action dance"},
        {"{'timeline': [{'atMs': 1, 'do': 'roam', 'far': 1}]}", "timeline[0].far: unknown member"},
        {"{'timeline': [{'atMs': 1, 'do': 'roam'}, {'atMs': 1, 'do': 'hide', 'bssid': 7}]}",
         "timeline[1].bssid: not a text"},
        {"{'timeline': [{'atMs': 1, 'do': 'hide'}]}", "timeline[0].bssid: missing"},
        {"{'timeline': [{'atMs': 1, 'do': 'pullAdapter', 'adapter': 1}]}",
         "timeline[0].adapter: no such adapter"},
        {"{'timeline': [{'atMs': 1, 'do': 'fail', 'call': 'WlanDance', 'error': 5}]}",
         "timeline[0].call: no call that can fail"},
        {"{'timeline': [{'atMs': 1, 'do': 'fail', 'call': 'WlanIhvControl', 'error': 5, 'match': 'scans'}]}",
         "timeline[0].match: no IHV request"},
        {"{'timeline': [{'atMs': 1, 'do': 'setNetwork', 'bssid': '02:00:00:00:00:01', 'hs20': 1}]}",
         "timeline[0].hs20: not a boolean"},
        {"{'timeline': [{'atMs': 1, 'do': 'addNetwork', 'network': {'ssid': 'a'}}]}",
         "timeline[0].network.bssid: missing"},
        {"{'timeline': [{'atMs': 1, 'do': 'interfaceState', 'value': 8}]}",
         "timeline[0].value: not from 0 to 7"},
    };
    for (const Case& c : cases)
        EXPECT_EQ(faultOf(c.text), c.fault) << c.text;
}

TEST(Scenario, WhatIsNoJsonIsToldInOneLine) {
    for (const std::string& text :
         {std::string("{"), std::string("{} {}"), std::string("{'speed': 1, // fast\n}"),
          std::string("{'seed': 1, 'seed': 2}"), std::string("\xFF"), std::string(100000, '[')}) {
        const std::string fault = faultOf(text);
        EXPECT_EQ(fault.rfind("scenario: not JSON: ", 0), 0U) << fault;
        EXPECT_EQ(fault.find('\n'), std::string::npos) << fault;
    }
}

TEST(Scenario, AnEmptyOneIsAPlainMachine) {
    const Scenario plain = scenario("{}");
    EXPECT_EQ(plain.speed, 1);
    EXPECT_EQ(plain.user, "KORVANE-PC\\user");
    ASSERT_EQ(plain.adapters.size(), 1U);
    EXPECT_EQ(plain.adapters[0].guidText, "{6B1E8A4C-5D2F-4E0B-9C37-1F5D00000001}");
    EXPECT_EQ(plain.adapters[0].hardwareId, "pci\\ven_1f5d&dev_0101");
    EXPECT_EQ(hexText(plain.adapters[0].macAddress), "021f5d000001");
    ASSERT_EQ(plain.registryClass.size(), 1U);
    EXPECT_EQ(plain.registryClass[0].netCfgInstanceId, plain.adapters[0].guidText);
    EXPECT_FALSE(plain.spectrum);
}

TEST(Scenario, AdaptersCountUp) {
    const Scenario two = scenario("{'adapters': [{'hardwareId': null}, {}]}");
    EXPECT_EQ(two.adapters[1].guidText, "{6B1E8A4C-5D2F-4E0B-9C37-1F5D00000002}");
    EXPECT_EQ(hexText(two.adapters[1].macAddress), "021f5d000002");
    EXPECT_FALSE(two.registryClass[0].matchingDeviceId);
    EXPECT_TRUE(two.registryClass[1].matchingDeviceId);
}

TEST(Scenario, NetworksKeepWhatTheyWereGiven) {
    const Scenario read = scenario(
        "{'networks': [{'bssid': '02:aB:00:00:00:01', 'ssid': 'caf\xC3\xA9', 'realms': ["
        "{'names': ['a.example', 'b.example'], 'eapMethods': [13, 21]}], 'anqp': 'onQuery', 'visible': false,"
        "'accepts': [{'eapMethod': 21, 'username': 'u'}]}]}");
    const Network& network = read.networks.at(0);
    EXPECT_EQ(hexText(network.bssid), "02ab00000001");
    EXPECT_EQ(hexText(network.ssid), "636166c3a9");
    EXPECT_EQ(network.realms->at(0).names, (std::vector<std::string>{"a.example", "b.example"}));
    EXPECT_EQ(network.realms->at(0).eapMethods, (std::vector<std::uint8_t>{13, 21}));
    EXPECT_EQ(network.anqp, AnqpAnswer::OnQuery);
    EXPECT_FALSE(network.visible);
    EXPECT_TRUE(network.reported);
    EXPECT_EQ(network.accepts.at(0).username, "u");
    EXPECT_FALSE(network.accepts.at(0).password);
}

TEST(Scenario, OneFormOfTheRealmListReplacesTheOther) {
    Network network =
        scenario("{'networks': [{'bssid': '02:00:00:00:00:01', 'ssid': 'a', 'realms': []}]}").networks[0];
    Json::Value changes;
    changes["naiRealmHex"] = "0000";
    changeNetwork(JsonPlace(changes, ""), network);
    EXPECT_FALSE(network.realms);
    EXPECT_EQ(network.naiRealmList, (Bytes{0, 0}));
}

TEST(Scenario, TheTimelineIsInOrderOfTimeAndEqualTimesAsWritten) {
    const Scenario read = scenario(
        "{'timeline': [{'atMs': 20, 'do': 'roam'}, {'atMs': 10, 'do': 'clearCalls'}, {'atMs': 20, 'do': "
        "'radio'}]}");
    ASSERT_EQ(read.timeline.size(), 3U);
    EXPECT_EQ(read.timeline[0].action["do"].asString(), "clearCalls");
    EXPECT_EQ(read.timeline[1].action["do"].asString(), "roam");
    EXPECT_EQ(read.timeline[2].action["do"].asString(), "radio");
    EXPECT_EQ(read.timeline[2].at, std::chrono::milliseconds(20));
}

TEST(Scenario, TheDemoShowsBothBandsAndMoves) {
    const Scenario demo = parseScenario(demoScenario());
    ASSERT_TRUE(demo.spectrum);
    for (const int channel : demo.spectrum->channels)
        EXPECT_EQ(demo.spectrum->levels.count(channel), 1U) << channel;
    EXPECT_LT(demo.spectrum->channels.front(), 14);
    EXPECT_GT(demo.spectrum->channels.back(), 32);
    ASSERT_FALSE(demo.timeline.empty());
    EXPECT_LT(demo.timeline.back().at, std::chrono::seconds(20) * demo.speed);
}

}  // namespace
}  // namespace vexa::simulation
