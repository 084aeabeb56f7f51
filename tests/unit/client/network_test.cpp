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

TEST(NetworkList, RealmsKeepTheirOrderAndNonsenseIsLeftOut) {
    const auto list = parsed(R"([{"NetWorkName":"n","RealmFetched":true,"SupportRealmList":[
        {"CredentialEapMethod":2,"RealmName":"b"},{"CredentialEapMethod":1,"RealmName":"a"},{"RealmName":7},
        {"RealmName":"c"}]}, {"NetWorkName":"m","IsConnected":true,"IsInternetAccess":"0"},
        {"NetWorkName":"l","IsConnected":null,"IsInternetAccess":2}, 7, null, {}, {"NetWorkName":3}])");
    ASSERT_EQ(list.size(), 3U);
    EXPECT_EQ(realmsText(list[0]), "b (TTLS), a (TLS)");
    EXPECT_EQ(list[1].internet, Network::Internet::None);
    EXPECT_EQ(list[2].internet, Network::Internet::Offered);
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
