#include "client/hotspot/Network.h"

#include <gtest/gtest.h>

#include "client/machine/MachineRegistry.h"
#include "client/port/JsonLine.h"

#include <fstream>

namespace vexa::client {
namespace {

NetworkList parsed(const std::string& text) {
    return networkList(parseJson(text).value());
}

TEST(NetworkList, InternetDependsOnTheConnection) {
    struct Case {
        const char* isConnected;
        const char* code;
        Network::Internet meaning;
    };
    using Internet = Network::Internet;
    for (const Case& example :
         {Case{"true", "0", Internet::Reached}, Case{"true", "1", Internet::Missing},
          Case{"true", "2", Internet::None}, Case{"false", "0", Internet::None},
          Case{"false", "2", Internet::Offered}, Case{"false", "1", Internet::None},
          Case{"null", "2", Internet::Offered}, Case{"true", "\"0\"", Internet::None}}) {
        const auto list = parsed(std::string(R"([{"NetWorkName":"n","IsConnected":)") + example.isConnected +
                                 R"(,"IsInternetAccess":)" + example.code + "}]");
        ASSERT_EQ(list.size(), 1U);
        EXPECT_EQ(list[0].internet, example.meaning) << example.isConnected << ' ' << example.code;
    }
}

TEST(NetworkList, RealmsKeepTheirOrderAndMethod) {
    const auto list = parsed(R"([{"NetWorkName":"n","RealmFetched":true,"SupportRealmList":[
        {"CredentialEapMethod":2,"RealmName":"b"},{"CredentialEapMethod":1,"RealmName":"a"},{"RealmName":7}]},
        {"NetWorkName":"m","RealmFetched":true},{"NetWorkName":"l","RealmFetched":false}])");
    const auto lines = networkTable(list);
    ASSERT_EQ(lines.size(), 4U);
    EXPECT_TRUE(lines[1].ends_with("b (TTLS), a (TLS)")) << lines[1];
    EXPECT_TRUE(lines[2].ends_with("none")) << lines[2];
    EXPECT_TRUE(lines[3].ends_with("not known yet")) << lines[3];
    const Json::Value json = networksJson(list);
    EXPECT_EQ(json[0]["realms"].size(), 2U);
    EXPECT_TRUE(json[1]["realms"].isArray());
    EXPECT_TRUE(json[2]["realms"].isNull());
}

TEST(NetworkList, NonsenseIsLeftOut) {
    for (const char* text : {"null", "7", "{}", "[]", "[7, null, {}, {\"NetWorkName\": 3}]"})
        EXPECT_TRUE(parsed(text).empty()) << text;
}

TEST(HotspotSwitch, IsOnUnlessTheRegistrySaysFalse) {
    const TemporaryMachine temporary;
    const MachineFolder machine(temporary.path().string());
    EXPECT_TRUE(readHotspotSwitch(machine));
    const std::string key = R"({"HKEY_CURRENT_USER\\Software\\Korvane\\Vexa":)";
    struct Case {
        std::string text;
        bool isOn;
    };
    for (const Case& example :
         {Case{"nonsense", true}, Case{"[]", true}, Case{key + "7}", true}, Case{key + "{}}", true},
          Case{key + R"({"IsHotSpotAutoConnect":"true"}})", true},
          Case{key + R"({"IsHotSpotAutoConnect":"False"}})", false},
          Case{key + R"({"IsHotSpotAutoConnect":"false "}})", true}}) {
        std::ofstream(machine.registryFile()) << example.text;
        EXPECT_EQ(readHotspotSwitch(machine), example.isOn) << example.text;
    }
}

TEST(HotspotSwitch, WritingLeavesOtherValuesAlone) {
    const TemporaryMachine temporary;
    const MachineFolder machine(temporary.path().string());
    std::ofstream(machine.registryFile())
        << R"({"HKEY_CURRENT_USER\\Other":{"a":1},"HKEY_CURRENT_USER\\Software\\Korvane\\Vexa":{"b":"c"}})";
    ASSERT_TRUE(writeHotspotSwitch(machine, false));
    EXPECT_FALSE(readHotspotSwitch(machine));
    std::ifstream file(machine.registryFile());
    const std::string text{std::istreambuf_iterator<char>(file), std::istreambuf_iterator<char>()};
    const Json::Value registry = parseJson(text).value();
    EXPECT_EQ(registry["HKEY_CURRENT_USER\\Other"]["a"].asInt(), 1);
    EXPECT_EQ(registry["HKEY_CURRENT_USER\\Software\\Korvane\\Vexa"]["b"].asString(), "c");
    ASSERT_TRUE(writeHotspotSwitch(machine, true));
    EXPECT_TRUE(readHotspotSwitch(machine));
    EXPECT_FALSE(writeHotspotSwitch(MachineFolder("/nonexistent"), false));
}

}  // namespace
}  // namespace vexa::client
