#include "simulation/scenario/Scenario.h"

#include <gtest/gtest.h>

#include <algorithm>

#include "simulation/scenario/DemoScenario.h"

namespace vexa::simulation {
namespace {

Scenario scenario(std::string text) {
    std::replace(text.begin(), text.end(), '\'', '"');
    return parseScenario(text);
}

std::string faultOf(const std::string& text) {
    try {
        scenario(text);
    } catch (const JsonFault& fault) {
        return fault.what();
    }
    return "no fault";
}

// A scenario with one network, or with one entry of the timeline.
std::string network(const std::string& members) {
    return "{'networks': [{'bssid': '02:00:00:00:00:01', " + members + "}]}";
}

std::string entry(const std::string& members) {
    return "{'timeline': [{" + members + "}]}";
}

TEST(Scenario, AFaultNamesTheMember) {
    const std::string x128(128, 'x');
    const auto named = [](const std::string& more) { return network("'ssid': 'a', " + more); };
    const std::pair<std::string, const char*> cases[] = {
        {"[]", "scenario: not an object"},
        {"{'foo': 1}", "foo: unknown member"},
        {"{'speed': 'fast'}", "speed: not a number"},
        {"{'speed': -1}", "speed: not from 0 to 1000000"},
        {"{'seed': 1.5}", "seed: not a whole number"},
        {"{'user': null}", "user: not a text"},
        {"{'session': 'asleep'}", "session: not one of active, disconnected"},
        {"{'connectMs': -5}", "connectMs: negative"},
        {"{'adapters': {}}", "adapters: not an array"},
        {"{'adapters': [{'guid': 'x'}]}", "adapters[0].guid: not a GUID"},
        {"{'adapters':[{'guid':'{6B1E8A4C 5D2F-4E0B-9C37-1F5D00000001}'}]}", "adapters[0].guid: not a GUID"},
        {"{'adapters':[{'guid':'{6B1E8A4C-5D2F-4E0B-9C37-1F5D0000000g}'}]}", "adapters[0].guid: not a GUID"},
        {"{'adapters': [{}, {'mac': '02:1f:5d'}]}", "adapters[1].mac: not a MAC address"},
        {"{'adapters': [{'mac': '02:1f:5d:00-00:01'}]}", "adapters[0].mac: not a MAC address"},
        {"{'adapters': [{'dns': ['192.0.2.1', 2]}]}", "adapters[0].dns[1]: not a text"},
        {"{'adapters': [{'inserted': 1}]}", "adapters[0].inserted: not a boolean"},
        {"{'registryClass': [{'guid': 'x'}]}", "registryClass[0].guid: unknown member"},
        {"{'networks': [{'ssid': 'a'}]}", "networks[0].bssid: missing"},
        {"{'networks': [{'bssid': '02:00:00:00:00:01'}]}", "networks[0].ssid: missing"},
        {network("'ssid': ''"), "networks[0].ssid: not 1 to 32 bytes"},
        {named("'ssidHex': '61'"), "networks[0].ssidHex: not together with ssid"},
        {named("'realms': [], 'naiRealmHex': ''"), "networks[0].naiRealmHex: not together with realms"},
        {network("'ssidHex': '0'"), "networks[0].ssidHex: not hex"},
        {network("'ssidHex': '0g'"), "networks[0].ssidHex: not hex"},
        {named("'realms': [{}, {'eapMethods': 13}]"), "networks[0].realms[1].eapMethods: not an array"},
        {named("'realms': [{'names': ['" + x128 + "', '" + x128.substr(1) + "']}]"),
         "networks[0].realms[0].names: more than 255 bytes"},
        {named("'accepts': [{'eapMethod': 25}]"), "networks[0].accepts[0].eapMethod: not one of 13, 21"},
        {named("'accepts': [{}]"), "networks[0].accepts[0].eapMethod: missing"},
        {"{'spectrum': {'channels': [1, 256]}}", "spectrum.channels[1]: not from 0 to 255"},
        {"{'spectrum': {'levels': {'one': {}}}}", "spectrum.levels.one: not a channel number"},
        {"{'spectrum': {'scans': [[{'bins': [1, 2]}]]}}", "spectrum.scans[0][0].bins: not 56 bins"},
        {entry("'do': 'roam'"), "timeline[0].atMs: missing"},
        {entry("'atMs': 1, 'do': 'hide', 'bssid': 7"), "timeline[0].bssid: not a text"},
        {entry("'atMs':1, 'do':'addNetwork', 'network':{'ssid':'a'}"), "timeline[0].network.bssid: missing"},
    };
    for (const auto& [text, fault] : cases)
        EXPECT_EQ(faultOf(text), fault) << text;
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

TEST(Scenario, WhatIsNotSaidIsAPlainMachineWhoseAdaptersCountUp) {
    const Scenario plain = scenario("{}");
    EXPECT_EQ(plain.speed, 1);
    EXPECT_EQ(plain.user, "KORVANE-PC\\user");
    EXPECT_FALSE(plain.spectrum);
    ASSERT_EQ(plain.adapters.size(), 1U);
    EXPECT_EQ(plain.adapters[0].guidText, "{6B1E8A4C-5D2F-4E0B-9C37-1F5D00000001}");
    EXPECT_EQ(plain.adapters[0].hardwareId, "pci\\ven_1f5d&dev_0101");
    EXPECT_EQ(hexText(plain.adapters[0].macAddress), "021f5d000001");
    const Scenario two = scenario("{'adapters': [{'hardwareId': null}, {}]}");
    EXPECT_EQ(two.adapters[1].guidText, "{6B1E8A4C-5D2F-4E0B-9C37-1F5D00000002}");
    EXPECT_EQ(hexText(two.adapters[1].macAddress), "021f5d000002");
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

TEST(Text, IsWrittenInEveryWidth) {
    EXPECT_EQ(latin1("caf\xC3\xA9 \xE2\x82\xAC"), "caf\xE9 ?");
    EXPECT_EQ(utf16("\xF0\x9F\x93\xB6"), u"\xD83D\xDCF6");
}

}  // namespace
}  // namespace vexa::simulation
