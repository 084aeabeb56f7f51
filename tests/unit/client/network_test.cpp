#include "client/hotspot/Network.h"

#include <gtest/gtest.h>

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

TEST(HotspotSwitch, CanNotBeWrittenWhereThereIsNoMachine) {
    EXPECT_FALSE(writeHotspotSwitch(MachineFolder("/nonexistent"), false));
}

}  // namespace
}  // namespace vexa::client
