#include "hotspot/Hs20NetworkList.h"

#include <gtest/gtest.h>

#include "unit/hotspot/LogCapture.h"

namespace vexa::test {
namespace {

Hs20BssRecord bss(std::uint8_t id, const std::string& ssid, std::uint32_t isHs20 = 1) {
    return {{2, 0, 0, 0, 0, id}, ssid, isHs20, 10U + id, id};
}

// "ssid/last octet", in order.
std::string shown(const Hs20NetworkList& list) {
    std::string text;
    for (const Hs20Network* network : list.copyPointers())
        text +=
            (text.empty() ? "" : " ") + network->ssidText() + "/" + std::to_string(network->m_macAddress[5]);
    return text;
}

TEST(NetworkList, AKnownBssKeepsItsNameAndItsRealmsAndTakesOverTheRest) {
    Hs20NetworkList list;
    list.replace({bss(1, "before", 0)});
    Hs20Network* const known = list.findByMac(bss(1, "").macAddress);
    known->m_realms = {{1, "r"}};
    Hs20BssRecord again = bss(1, "after", 1);
    again.networkType = 99;
    again.internetAccess = 98;
    LogCapture log;
    EXPECT_TRUE(list.replace({again}).empty());
    EXPECT_EQ(list.copyPointers(), std::vector{known});
    EXPECT_EQ(known->ssid(), "before");
    EXPECT_TRUE(known->m_bHs20);
    EXPECT_EQ(known->m_networkType, 99U);
    EXPECT_EQ(known->m_internetAccess, 98U);
    EXPECT_EQ(known->m_realms, (std::vector<RealmInfo>{{1, "r"}}));
    EXPECT_EQ(log.text(),
              "There already exists a network with ssid=after, updating network info....\n"
              "The HS20 attribute has been changed for this network.\n");
}

TEST(NetworkList, ANewAddressIsANewNetworkWhateverItsName) {
    Hs20NetworkList list;
    list.replace({bss(1, "same")});
    const auto gone = list.replace({bss(2, "same", 7)});
    ASSERT_EQ(gone.size(), 1U);
    EXPECT_EQ(gone[0]->m_macAddress[5], 1);
    EXPECT_FALSE(list.copyPointers()[0]->m_bHs20);
    EXPECT_EQ(list.findByMac(bss(1, "").macAddress), nullptr);
}

TEST(NetworkList, OfOneNameTheFirstKnownNetworkStaysOrElseTheFirst) {
    const std::tuple<std::vector<Hs20BssRecord>, std::vector<Hs20BssRecord>, const char*> cases[] = {
        {{bss(5, "x")}, {bss(6, "x"), bss(7, "y"), bss(5, "x"), bss(8, "x")}, "y/7 x/5"},
        {{bss(1, "x"), bss(2, "x"), bss(3, "x")}, {bss(9, "x"), bss(3, "x"), bss(1, "x")}, "x/3"},
        {{}, {bss(1, "x"), bss(2, "x")}, "x/1"},
        {{}, {bss(1, "x"), bss(1, "x"), bss(2, "y"), bss(1, "x")}, "x/1 y/2"},
        {{bss(1, "x")}, {}, ""},
        {{}, {bss(1, "bc"), bss(2, "bcd"), bss(3, "BC"), bss(4, ""), bss(5, "b")}, "bc/1 bcd/2 BC/3 /4 b/5"},
    };
    for (const auto& [known, reported, left] : cases) {
        Hs20NetworkList list;
        list.replace(known);
        const auto oldMacs = list.macAddresses();
        list.replace(reported);
        list.processDuplicatedHs20Networks(oldMacs);
        EXPECT_EQ(shown(list), left);
    }
}

TEST(NetworkList, ManyAccessPointsOfOneNameHaveNoMoreRealmsThanOne) {
    Hs20NetworkList list;
    list.replace({bss(1, "x"), bss(2, "x"), bss(3, "x")});
    for (Hs20Network* network : list.copyPointers()) {
        std::vector<RealmInfo> realms;
        for (int i = 0; i < 100; ++i)
            realms.push_back({1, std::to_string(network->m_macAddress[5] * 100 + i)});
        network->m_realms = std::move(realms);
    }
    LogCapture log;
    list.processDuplicatedHs20Networks({});
    EXPECT_EQ(list.copyPointers()[0]->m_realms.size(), 256U);
    EXPECT_EQ(*std::prev(list.copyPointers()[0]->m_realms.end()), (RealmInfo{1, "355"}));
    EXPECT_NE(log.text().find("\tMacAddress=02:00:00:00:00:03\n"
                              "\tThis network announces too many realms, only the first 256 are kept.\n"
                              "This network with index=0"),
              std::string::npos);
}

}  // namespace
}  // namespace vexa::test
