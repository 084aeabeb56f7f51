#include "client/hotspot/Network.h"

#include <gtest/gtest.h>

#include <fstream>

#include "client/machine/MachineRegistry.h"
#include "client/port/JsonLine.h"

namespace vexa::client {
namespace {

NetworkList parsed(const std::string& text) {
    return networkList(parseJson(text).value());
}

TEST(NetworkList, InternetDependsOnTheConnection) {
    using Internet = Network::Internet;
    const std::pair<std::string, Internet> cases[] = {
        {R"("IsConnected":true,"IsInternetAccess":0)", Internet::Reached},
        {R"("IsConnected":true,"IsInternetAccess":1)", Internet::Missing},
        {R"("IsConnected":true,"IsInternetAccess":2)", Internet::None},
        {R"("IsConnected":false,"IsInternetAccess":0)", Internet::None},
        {R"("IsConnected":false,"IsInternetAccess":2)", Internet::Offered},
        {R"("IsConnected":null,"IsInternetAccess":2)", Internet::Offered},
        {R"("IsConnected":true,"IsInternetAccess":"0")", Internet::None},
    };
    for (const auto& [members, meaning] : cases)
        EXPECT_EQ(parsed(R"([{"NetWorkName":"n",)" + members + "}]").at(0).internet, meaning) << members;
}

TEST(NetworkList, RealmsKeepTheirOrderAndMethodAndNonsenseIsLeftOut) {
    const auto list = parsed(R"([{"NetWorkName":"n","RealmFetched":true,"SupportRealmList":[
        {"CredentialEapMethod":2,"RealmName":"b"},{"CredentialEapMethod":1,"RealmName":"a"},{"RealmName":7}]},
        {"NetWorkName":"m","RealmFetched":true},{"NetWorkName":"l","RealmFetched":false},
        7, null, {}, {"NetWorkName":3}])");
    const auto lines = networkTable(list);
    ASSERT_EQ(lines.size(), 4U);
    EXPECT_TRUE(lines[1].ends_with("b (TTLS), a (TLS)")) << lines[1];
    EXPECT_TRUE(lines[2].ends_with("none")) << lines[2];
    EXPECT_TRUE(lines[3].ends_with("not known yet")) << lines[3];
    const Json::Value json = networksJson(list);
    EXPECT_EQ(json[0]["realms"].size(), 2U);
    EXPECT_TRUE(json[1]["realms"].isArray());
    EXPECT_TRUE(json[2]["realms"].isNull());
    for (const char* text : {"null", "7", "{}", "[]"})
        EXPECT_TRUE(parsed(text).empty()) << text;
}

TEST(HotspotSwitch, IsOnUnlessTheRegistrySaysFalse) {
    const TemporaryMachine temporary;
    const MachineFolder machine(temporary.path().string());
    EXPECT_TRUE(readHotspotSwitch(machine));
    const std::string key = R"({"HKEY_CURRENT_USER\\Software\\Korvane\\Vexa":)";
    const std::pair<std::string, bool> cases[] = {
        {"nonsense", true},
        {key + "7}", true},
        {key + R"({"IsHotSpotAutoConnect":7}})", true},
        {key + R"({"IsHotSpotAutoConnect":"False"}})", false},
        {key + R"({"IsHotSpotAutoConnect":"false "}})", true},
    };
    for (const auto& [text, isOn] : cases) {
        std::ofstream(machine.registryFile()) << text;
        EXPECT_EQ(readHotspotSwitch(machine), isOn) << text;
    }
}

TEST(HotspotSwitch, WritingLeavesOtherValuesAlone) {
    const TemporaryMachine temporary;
    const MachineFolder machine(temporary.path().string());
    std::ofstream(machine.registryFile())
        << R"({"HKEY_CURRENT_USER\\Other":{"a":1},"HKEY_CURRENT_USER\\Software\\Korvane\\Vexa":{"b":"c"}})";
    ASSERT_TRUE(writeHotspotSwitch(machine, false));
    EXPECT_FALSE(readHotspotSwitch(machine));
    std::string text;
    std::getline(std::ifstream(machine.registryFile()), text);
    EXPECT_EQ(text,
              R"({"HKEY_CURRENT_USER\\Other":{"a":1},)"
              R"("HKEY_CURRENT_USER\\Software\\Korvane\\Vexa":{"IsHotSpotAutoConnect":"false","b":"c"}})");
    ASSERT_TRUE(writeHotspotSwitch(machine, true));
    EXPECT_TRUE(readHotspotSwitch(machine));
    EXPECT_FALSE(writeHotspotSwitch(MachineFolder("/nonexistent"), false));
}

}  // namespace
}  // namespace vexa::client
