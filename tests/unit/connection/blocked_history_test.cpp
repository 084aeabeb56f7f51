#include <gtest/gtest.h>

#include "config/CredentialTable.h"
#include "config/ResultCodes.h"
#include "connection/BlockedNetworkList.h"
#include "connection/ConnectionHistory.h"
#include "unit/hotspot/LogCapture.h"

namespace vexa::test {
namespace {

class Memory : public testing::Test {
protected:
    Memory() ACQUIRE(g_hs20Lock) { g_hs20Lock.lock(); }
    ~Memory() override RELEASE(g_hs20Lock) { g_hs20Lock.unlock(); }

    void inRange(const std::vector<std::string>& ssids) REQUIRES(g_hs20Lock) {
        std::vector<Hs20BssRecord> records;
        for (const std::string& ssid : ssids)
            records.push_back({{1, 2, 3, 4, 5, static_cast<std::uint8_t>(records.size())}, ssid, 1, 2, 1});
        m_networks.replace(records);
        for (Hs20Network* network : m_networks.copyPointers())
            network->m_realms = {{2, "a.example"}};
    }

    Credential& store(std::int32_t id, const std::wstring& realm, bool autoConnect) REQUIRES(g_hs20Lock) {
        auto credential =
            std::make_unique<Credential>(id, L"PC\\user", CRED_TYPE_EAP_TTLS, CRED_ACCESS_ALL_USER);
        credential->m_realm = realm;
        credential->m_eapMethod = kEapMethodTtls;
        credential->m_username = L"u";
        credential->m_password = L"p";
        credential->m_bAutoConnect = autoConnect;
        Credential& stored = *credential;
        m_table.appendUnplaced(std::move(credential));
        return stored;
    }

    // Of these names, the blocked ones.
    std::string blocked(const std::vector<std::string>& ssids) REQUIRES(g_hs20Lock) {
        std::string text;
        for (const std::string& ssid : ssids)
            if (m_blocked.isBlocked(Hs20Network(Hs20BssRecord{{}, ssid, 1, 2, 1})))
                text += (text.empty() ? "" : " ") + ssid;
        return text;
    }

    CredentialTable m_table;
    Hs20NetworkList m_networks;
    BlockedNetworkList m_blocked;
    ConnectionHistory m_history;
};

TEST_F(Memory, ABlockIsForOneNameExactly) {
    const std::string longest = "0123456789abcdef0123456789ABCDEF";
    EXPECT_EQ(m_blocked.blockNetwork("cafe", true), 1);
    EXPECT_EQ(m_blocked.blockNetwork("cafe", false), 0);
    EXPECT_EQ(m_blocked.blockNetwork(longest, false), 1);
    EXPECT_EQ(m_blocked.blockNetwork(longest + "x", false), 0);
    EXPECT_EQ(blocked({"cafe", "caf", "cafeteria", "Cafe", longest}), "cafe " + longest);
    EXPECT_FALSE(m_blocked.unblockNetwork("caf"));
    EXPECT_TRUE(m_blocked.unblockNetwork("cafe"));
    EXPECT_FALSE(m_blocked.unblockNetwork("cafe"));
    EXPECT_EQ(blocked({"cafe", longest}), longest);
}

TEST_F(Memory, ARepeatedBlockIsToldButKeepsTheFirstOnesOrigin) {
    LogCapture log;
    m_blocked.blockNetwork("cafe", true);
    m_blocked.blockNetwork("cafe", false);
    EXPECT_EQ(log.text(),
              "We are going to block network with ssid=cafe\nWe are going to block network with ssid=cafe\n");
    m_blocked.unblockRecentNetworks();
    EXPECT_EQ(log.text(), "This network with ssid=cafe has been blocked by user, don't unblock it.\n");
    EXPECT_EQ(blocked({"cafe"}), "cafe");
}

TEST_F(Memory, ANewCredentialOpensWhatItFits) {
    inRange({"cafe", "hotel"});
    for (const char* ssid : {"cafe", "gone", "hotel", "caf"})
        m_blocked.blockNetwork(ssid, true);
    m_networks.copyPointers()[1]->m_realms = {{2, "b.example"}};
    store(3, L"a.example", true);
    LogCapture log;
    EXPECT_EQ(m_blocked.onCredentialAdded(3, m_table, m_networks), kSuccess);
    const std::string told = log.text();
    EXPECT_TRUE(told.starts_with("Newly added credential with id=3.\n")) << told;
    EXPECT_NE(told.find("ERROR: Invalid BSS.\n"), std::string::npos) << told;
    EXPECT_EQ(blocked({"cafe", "gone", "hotel", "caf"}), "gone hotel")
        << "the beginning of a name counts for the network that has it";
}

TEST_F(Memory, ANewCredentialOpensNothingWhereItCanNot) {
    struct Case {
        std::int32_t id;
        ResultCode result;
        const char* line;
    };
    inRange({"cafe"});
    store(4, L"a.example", false);
    const Case cases[] = {
        {4, kSuccess, "Credential is not auto-connected, don't unblock any network.\n"},
        {5, kFailure, "ERROR: Cannot get credential.\n"},
        {0, kFailure, "ERROR: Cannot get credential.\n"},
        {-1, kInvalidArgument, ""},
    };
    m_blocked.blockNetwork("cafe", false);
    LogCapture log;
    for (const Case& c : cases) {
        EXPECT_EQ(m_blocked.onCredentialAdded(c.id, m_table, m_networks), c.result) << c.id;
        EXPECT_EQ(log.text(), "Newly added credential with id=" + std::to_string(c.id) + ".\n" + c.line);
    }
    EXPECT_EQ(blocked({"cafe"}), "cafe");
}

TEST_F(Memory, ACredentialThatMayConnectNowOpensTheNetworksInRangeThatItFits) {
    inRange({"cafe", "hotel"});
    m_networks.copyPointers()[1]->m_realms = {{2, "b.example"}};
    for (const char* ssid : {"cafe", "hotel", "caf"})
        m_blocked.blockNetwork(ssid, true);
    store(3, L"a.example", false);
    LogCapture log;
    EXPECT_EQ(m_blocked.onCredentialAutoConnectChanged(3, m_table, m_networks), kSuccess);
    const std::string told = log.text();
    EXPECT_TRUE(told.starts_with("Credential with id=3 has auto connect property changed.\n")) << told;
    EXPECT_NE(told.find("Unblock network with ssid=cafe and mac address=01:02:03:04:05:00 due to "
                        "corresponding credential changed from 'manual connect' to 'auto connect'\n"),
              std::string::npos)
        << told;
    EXPECT_EQ(blocked({"cafe", "hotel", "caf"}), "hotel caf");
    EXPECT_EQ(m_blocked.onCredentialAutoConnectChanged(9, m_table, m_networks), kFailure);
    EXPECT_EQ(m_blocked.onCredentialAutoConnectChanged(-1, m_table, m_networks), kInvalidArgument);
}

DOT11_SSID ssidOf(std::string_view name) {
    DOT11_SSID ssid{static_cast<ULONG>(name.size()), {}};
    std::copy(name.begin(), name.end(), std::begin(ssid.ucSSID));
    return ssid;
}

TEST_F(Memory, AHistoryHoldsTheNetworksOfTheListAlone) {
    inRange({"cafe"});
    LogCapture log;
    EXPECT_EQ(m_history.addConnection(ssidOf("home"), {}, m_networks), kSuccess);
    EXPECT_EQ(m_history.last(), nullptr);
    EXPECT_EQ(m_history.updateDisconnection(ssidOf("home"), m_networks), kSuccess);
    EXPECT_EQ(m_history.updateDisconnection(ssidOf("cafe"), m_networks), kSuccess);
    EXPECT_EQ(log.text(),
              "Not a HS20 network, don't adding history.\nNot a HS20 network, don't update history.\n"
              "No connection history info while we disconnected from a network.\n");
}

TEST_F(Memory, AHistoryOpensAndClosesItsLastRecord) {
    inRange({"cafe", "hotel"});
    m_history.addConnection(ssidOf("cafe"), {1, 2, 3, 4, 5, 6}, m_networks);
    EXPECT_EQ(bytesOf(m_history.last()->m_ssid), "cafe");
    EXPECT_FALSE(m_history.last()->m_bDisconnectedTimeValid);
    LogCapture log;
    EXPECT_EQ(m_history.updateDisconnection(ssidOf("hotel"), m_networks), kFailure);
    EXPECT_EQ(log.lines().front(),
              "ERROR: The ssid is not equal, last connection ssid=cafe while disconnected ssid=hotel");
    EXPECT_FALSE(m_history.last()->m_bDisconnectedTimeValid);
    EXPECT_EQ(m_history.updateDisconnection(ssidOf("cafe"), m_networks), kSuccess);
    EXPECT_TRUE(m_history.last()->m_bDisconnectedTimeValid);
    log.text();
    m_history.addConnection(ssidOf("hotel"), {}, m_networks);
    m_history.addConnection(ssidOf("cafe"), {}, m_networks);
    EXPECT_NE(log.text().find("Disconnected time not specified for last connection, ssid=hotel\n"),
              std::string::npos);
    EXPECT_FALSE(m_history.last()->m_bDisconnectedTimeValid);
}

// The service fills what it doesn't use with zeros; something else is not what was recorded.
TEST_F(Memory, AHistoryComparesTheWholeFieldOfAnSsid) {
    inRange({"cafe"});
    m_history.addConnection(ssidOf("cafe"), {}, m_networks);
    DOT11_SSID tooLong = ssidOf("cafe");
    tooLong.uSSIDLength = 40;
    LogCapture log;
    EXPECT_EQ(m_history.updateDisconnection(tooLong, m_networks), kSuccess);
    EXPECT_EQ(log.text(), "Not a HS20 network, don't update history.\n");
    DOT11_SSID withRest = ssidOf("cafe");
    withRest.ucSSID[31] = 1;
    EXPECT_EQ(m_history.updateDisconnection(withRest, m_networks), kFailure);
    EXPECT_FALSE(m_history.last()->m_bDisconnectedTimeValid);
}

TEST_F(Memory, TheHistoryBeginsAnewBehindItsFiftiethConnection) {
    inRange({"cafe"});
    LogCapture log;
    const std::string overflow = "Connection history entries overflow, clear all entries.\n";
    for (int i = 1; i <= 101; ++i) {
        m_history.addConnection(ssidOf("cafe"), {}, m_networks);
        EXPECT_EQ(log.text().find(overflow) != std::string::npos, i == 51 || i == 101) << i;
    }
}

}  // namespace
}  // namespace vexa::test
