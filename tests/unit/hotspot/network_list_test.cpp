#include "hotspot/Hs20NetworkList.h"

#include <gtest/gtest.h>

#include <algorithm>

#include "unit/hotspot/LogCapture.h"

namespace vexa::test {
namespace {

using platform::LockGuard;

Hs20BssRecord bss(std::uint8_t id, const std::string& ssid, std::uint32_t isHs20 = 1) {
    return {{2, 0, 0, 0, 0, id}, ssid, isHs20, 10U + id, id};
}

// "ssid/last octet", in order.
std::string shown(const Hs20NetworkList& list) REQUIRES(g_hs20Lock) {
    std::string text;
    for (const Hs20Network* network : list.copyPointers())
        text +=
            (text.empty() ? "" : " ") + network->ssidText() + "/" + std::to_string(network->m_macAddress[5]);
    return text;
}

std::string realmsOf(const Hs20Network* network) {
    std::string text;
    for (const RealmInfo& realm : network->m_realms)
        text += (text.empty() ? "" : ", ") + realm.m_realm + (realm.m_eapType == 2 ? " TTLS" : " TLS");
    return text;
}

// One report as the service takes it over, without the fetch of realm data.
void report(Hs20NetworkList& list, const std::vector<Hs20BssRecord>& records) REQUIRES(g_hs20Lock) {
    const auto oldMacs = list.macAddresses();
    list.replace(records);
    list.processDuplicatedHs20Networks(oldMacs);
}

class NetworkList : public testing::Test {
protected:
    NetworkList() ACQUIRE(g_hs20Lock) { g_hs20Lock.lock(); }
    ~NetworkList() override RELEASE(g_hs20Lock) { g_hs20Lock.unlock(); }

    Hs20NetworkList m_list;
};

TEST_F(NetworkList, FollowsTheOrderOfTheLastReport) {
    m_list.replace({bss(1, "a"), bss(2, "b"), bss(3, "c")});
    m_list.replace({bss(3, "c"), bss(1, "a"), bss(4, "d")});
    EXPECT_EQ(shown(m_list), "c/3 a/1 d/4");
}

TEST_F(NetworkList, AKnownBssKeepsItsNameAndItsRealmsAndTakesOverTheRest) {
    m_list.replace({bss(1, "before", 0)});
    Hs20Network* const known = m_list.findByMac(bss(1, "").macAddress);
    known->m_realms = {{1, "r"}};
    known->m_anqpNaiRealm = {std::byte{1}};
    Hs20BssRecord again = bss(1, "after", 1);
    again.networkType = 99;
    again.internetAccess = 98;
    LogCapture log;
    EXPECT_TRUE(m_list.replace({again}).empty());
    EXPECT_EQ(m_list.copyPointers(), std::vector{known});
    EXPECT_EQ(known->ssid(), "before");
    EXPECT_TRUE(known->m_bHs20);
    EXPECT_EQ(known->m_networkType, 99U);
    EXPECT_EQ(known->m_internetAccess, 98U);
    EXPECT_EQ(realmsOf(known), "r TLS");
    EXPECT_TRUE(known->hasRealmData());
    EXPECT_EQ(log.text(),
              "There already exists a network with ssid=after, updating network info....\n"
              "The HS20 attribute has been changed for this network.\n");
}

TEST_F(NetworkList, ANewAddressIsANewNetworkWhateverItsName) {
    m_list.replace({bss(1, "same")});
    LogCapture log;
    const auto gone = m_list.replace({bss(2, "same", 7)});
    ASSERT_EQ(gone.size(), 1U);
    EXPECT_EQ(gone[0]->m_macAddress[5], 1);
    EXPECT_FALSE(m_list.copyPointers()[0]->m_bHs20);
    EXPECT_EQ(log.text(),
              "We scanned a new HS20 network with ssid=same, adding to the network list...\n"
              "\tssid=same\n");
}

TEST_F(NetworkList, FindsTheFirstNameThatBeginsWithTheBytes) {
    m_list.replace({bss(1, "abcd"), bss(2, "abc"), bss(3, std::string(32, 'z'))});
    const auto found = [&](std::string_view ssid) REQUIRES(g_hs20Lock) {
        const Hs20Network* const network = m_list.findBySsid(ssid);
        return network == nullptr ? 0 : network->m_macAddress[5];
    };
    EXPECT_EQ(found("abc"), 1);
    EXPECT_EQ(found(std::string_view("abc\0", 4)), 2) << "what follows a name is zero";
    EXPECT_EQ(found("abcde"), 0);
    EXPECT_EQ(found(""), 0);
    EXPECT_EQ(found(std::string(32, 'z')), 3);
    EXPECT_EQ(found(std::string(33, 'z')), 0);
}

TEST_F(NetworkList, FindsByAddressWhatWasReportedLast) {
    m_list.replace({bss(1, "a"), bss(2, "b")});
    EXPECT_EQ(m_list.findByMac(bss(2, "").macAddress)->ssid(), "b");
    EXPECT_EQ(m_list.findByMac(bss(9, "").macAddress), nullptr);
}

TEST_F(NetworkList, OfOneNameTheKnownNetworkStaysWhereverItIsReported) {
    report(m_list, {bss(5, "x")});
    report(m_list, {bss(6, "x"), bss(7, "y"), bss(5, "x"), bss(8, "x")});
    EXPECT_EQ(shown(m_list), "y/7 x/5");
}

TEST_F(NetworkList, OfNewNetworksTheFirstStaysAndTheLogSaysTheSame) {
    LogCapture log;
    report(m_list, {bss(1, "x"), bss(2, "x")});
    EXPECT_EQ(shown(m_list), "x/1");
    EXPECT_NE(
        log.text().find("Processing duplicated HS20 networks...\n"
                        "Found duplicate HS20 networks with same ssid=x\n"
                        "\tMacAddress=02:00:00:00:00:01\n"
                        "\tMacAddress=02:00:00:00:00:02\n"
                        "This network with index=0 and mac address02:00:00:00:00:01 exists before, thus we "
                        "will keep it.\n"),
        std::string::npos);
}

TEST_F(NetworkList, OfSeveralKnownNetworksTheFirstOfTheReportStays) {
    m_list.replace({bss(1, "x"), bss(2, "x"), bss(3, "x")});
    report(m_list, {bss(9, "x"), bss(3, "x"), bss(1, "x")});
    EXPECT_EQ(shown(m_list), "x/3");
}

TEST_F(NetworkList, TheOneThatStaysHasTheRealmsOfThemAllInOrder) {
    m_list.replace({bss(1, "x"), bss(2, "x"), bss(3, "x")});
    const auto networks = m_list.copyPointers();
    networks[0]->m_realms = {{1, "A"}};
    networks[1]->m_realms = {{1, "A"}, {2, "B"}, {2, "A"}};
    networks[2]->m_realms = {{1, "C"}, {1, "a"}};
    m_list.processDuplicatedHs20Networks({bss(2, "").macAddress});
    EXPECT_EQ(shown(m_list), "x/2");
    EXPECT_EQ(realmsOf(m_list.copyPointers()[0]), "A TLS, B TTLS, A TTLS, C TLS, a TLS");
}

TEST_F(NetworkList, ANetworkByItselfKeepsItsRealmsAsTheyAre) {
    m_list.replace({bss(1, "x")});
    m_list.copyPointers()[0]->m_realms = {{1, "A"}, {1, "A"}};
    m_list.processDuplicatedHs20Networks({});
    EXPECT_EQ(realmsOf(m_list.copyPointers()[0]), "A TLS, A TLS");
}

TEST_F(NetworkList, GroupsAreWalkedByTheBytesOfTheirNames) {
    m_list.replace({bss(1, "\xff"), bss(2, "b"), bss(3, "\xff"), bss(4, "B"), bss(5, "b"), bss(6, "B")});
    LogCapture log;
    m_list.processDuplicatedHs20Networks({});
    std::string order;
    for (const std::string& line : log.lines())
        if (line.starts_with("Found duplicate")) order += line.substr(line.find('=') + 1) + " ";
    EXPECT_EQ(order, "B b \xff ");
    EXPECT_EQ(shown(m_list), "\xff/1 b/2 B/4");
}

TEST_F(NetworkList, NamesThatDifferInLengthOrCaseAreNotFolded) {
    report(m_list, {bss(1, "abc"), bss(2, "abcd"), bss(3, "ABC"), bss(4, ""), bss(5, "ab")});
    EXPECT_EQ(m_list.size(), 5U);
}

TEST_F(NetworkList, AnAddressThatIsReportedTwiceIsFoldedToo) {
    report(m_list, {bss(1, "x"), bss(1, "x"), bss(1, "x")});
    EXPECT_EQ(shown(m_list), "x/1");
    report(m_list, {bss(1, "x"), bss(2, "y"), bss(1, "x")});
    EXPECT_EQ(shown(m_list), "x/1 y/2");
}

TEST_F(NetworkList, WithoutNetworksNothingIsFolded) {
    m_list.processDuplicatedHs20Networks({bss(1, "").macAddress});
    EXPECT_EQ(m_list.size(), 0U);
}

}  // namespace
}  // namespace vexa::test
