#include <gtest/gtest.h>

#include "config/CredentialTable.h"
#include "config/ResultCodes.h"
#include "connection/BlockedNetworkList.h"
#include "connection/ConnectionHistory.h"
#include "connection/NetworkRetryHelper.h"
#include "unit/hotspot/LogCapture.h"

namespace vexa::test {
namespace {

const std::string kLongest = "0123456789abcdef0123456789ABCDEF";

/// What the engine remembers between attempts to connect, with networks in range and stored credentials.
class EngineMemory : public testing::Test {
protected:
    void inRange(const std::vector<std::string>& ssids) {
        std::vector<Hs20BssRecord> records;
        for (const std::string& ssid : ssids)
            records.push_back({{1, 2, 3, 4, 5, static_cast<std::uint8_t>(records.size())}, ssid, 1, 2, 1});
        m_networks.replace(records);
        for (Hs20Network* network : m_networks.copyPointers())
            network->m_realms = {{2, network->ssidText() == "hotel" ? "b.example" : "a.example"}};
    }

    void store(std::int32_t id, bool autoConnect, std::int32_t type = CRED_TYPE_EAP_TTLS,
               std::int32_t method = kEapMethodTtls) {
        auto credential = std::make_unique<Credential>(id, L"PC\\user", type, CRED_ACCESS_ALL_USER);
        credential->m_realm = L"a.example";
        credential->m_eapMethod = method;
        credential->m_username = L"u";
        credential->m_password = L"p";
        credential->m_bAutoConnect = autoConnect;
        m_table.appendUnplaced(std::move(credential));
    }

    // Of these names, the blocked ones.
    std::string blocked(const std::vector<std::string>& ssids) {
        std::string text;
        for (const std::string& ssid : ssids)
            if (m_blocked.isBlocked(Hs20Network(Hs20BssRecord{{}, ssid, 1, 2, 1})))
                text += (text.empty() ? "" : " ") + ssid;
        return text;
    }

    int attemptsAllowed(std::int32_t id) {
        int attempts = 0;
        for (; attempts < 5 && m_retries.isRetryAllowed(m_table, id, "cafe"); ++attempts)
            m_retries.increaseNumRetries(id, "cafe");
        return attempts;
    }

    CredentialTable m_table;
    Hs20NetworkList m_networks;
    BlockedNetworkList m_blocked;
    ConnectionHistory m_history;
    NetworkRetryHelper m_retries;
};

TEST_F(EngineMemory, ABlockIsForOneNameExactly) {
    EXPECT_EQ(m_blocked.blockNetwork("cafe", true), 1);
    EXPECT_EQ(m_blocked.blockNetwork("cafe", false), 0);
    EXPECT_EQ(m_blocked.blockNetwork(kLongest, false), 1);
    EXPECT_EQ(m_blocked.blockNetwork(kLongest + "x", false), 0);
    EXPECT_EQ(blocked({"cafe", "caf", "cafeteria", "Cafe", kLongest}), "cafe " + kLongest);
    EXPECT_FALSE(m_blocked.unblockNetwork("caf"));
    EXPECT_TRUE(m_blocked.unblockNetwork("cafe"));
    EXPECT_EQ(blocked({"cafe", kLongest}), kLongest);
}

TEST_F(EngineMemory, ACredentialThatIsNewOrMayConnectNowOpensWhatItFits) {
    using Change =
        ResultCode (BlockedNetworkList::*)(std::int32_t, const CredentialTable&, const Hs20NetworkList&);
    const Change added = &BlockedNetworkList::onCredentialAdded;
    const Change changed = &BlockedNetworkList::onCredentialAutoConnectChanged;
    const char* const all = "cafe gone hotel caf";
    // The beginning of a name counts for the network that has it, but not where networks are gone through.
    const std::tuple<Change, std::int32_t, ResultCode, const char*, const char*> cases[] = {
        {added, 3, kSuccess, "gone hotel", "ERROR: Invalid BSS.\n"},
        {added, 4, kSuccess, all, "Credential is not auto-connected, don't unblock any network.\n"},
        {added, 0, kFailure, all, "ERROR: Cannot get credential.\n"},
        {added, 5, kFailure, all, "ERROR: Cannot get credential.\n"},
        {added, -1, kInvalidArgument, all, "Newly added credential with id=-1.\n"},
        {changed, 4, kSuccess, "gone hotel caf",
         "Unblock network with ssid=cafe and mac address=01:02:03:04:05:00 due to corresponding credential "
         "changed from 'manual connect' to 'auto connect'\n"},
        {changed, 5, kFailure, all, "ERROR: Cannot get credential.\n"},
        {changed, -1, kInvalidArgument, all, "Credential with id=-1 has auto connect property changed.\n"},
    };
    inRange({"cafe", "hotel"});
    store(3, true);
    store(4, false);
    LogCapture log;
    for (const auto& [change, id, result, left, line] : cases) {
        for (const char* ssid : {"cafe", "gone", "hotel", "caf"})
            m_blocked.blockNetwork(ssid, true);
        log.lines();
        EXPECT_EQ((m_blocked.*change)(id, m_table, m_networks), result) << line;
        EXPECT_NE(log.text().find(line), std::string::npos) << line;
        EXPECT_EQ(blocked({"cafe", "gone", "hotel", "caf"}), left) << line;
    }
}

DOT11_SSID ssidOf(std::string_view name) {
    DOT11_SSID ssid{static_cast<ULONG>(name.size()), {}};
    std::copy(name.begin(), name.end(), std::begin(ssid.ucSSID));
    return ssid;
}

TEST_F(EngineMemory, TheHistoryHoldsTheNetworksOfTheListAndEndsItsLastConnectionAlone) {
    inRange({"cafe", "hotel"});
    LogCapture log;
    EXPECT_EQ(m_history.addConnection(ssidOf("home"), {}, m_networks), kSuccess);
    EXPECT_EQ(m_history.updateDisconnection(ssidOf("home"), m_networks), kSuccess);
    EXPECT_EQ(m_history.updateDisconnection(ssidOf("cafe"), m_networks), kSuccess);
    EXPECT_EQ(log.text(),
              "Not a HS20 network, don't adding history.\n"
              "Not a HS20 network, don't update history.\n"
              "No connection history info while we disconnected from a network.\n");
    EXPECT_EQ(m_history.last(), nullptr);
    m_history.addConnection(ssidOf("cafe"), {}, m_networks);
    EXPECT_EQ(m_history.updateDisconnection(ssidOf("hotel"), m_networks), kFailure);
    EXPECT_EQ(log.lines().front(),
              "ERROR: The ssid is not equal, last connection ssid=cafe while disconnected ssid=hotel");
    EXPECT_FALSE(m_history.last()->m_bDisconnectedTimeValid);
    DOT11_SSID withRest = ssidOf("cafe");
    withRest.ucSSID[31] = 1;
    EXPECT_EQ(m_history.updateDisconnection(withRest, m_networks), kFailure)
        << "the service fills with zeros";
    EXPECT_EQ(m_history.updateDisconnection(ssidOf("cafe"), m_networks), kSuccess);
    EXPECT_TRUE(m_history.last()->m_bDisconnectedTimeValid);
    m_history.addConnection(ssidOf("hotel"), {}, m_networks);
    m_history.addConnection(ssidOf("cafe"), {}, m_networks);
    EXPECT_EQ(bytesOf(m_history.last()->m_ssid), "cafe");
    EXPECT_NE(log.text().find("Disconnected time not specified for last connection, ssid=hotel\n"),
              std::string::npos);
}

TEST_F(EngineMemory, TheHistoryBeginsAnewBehindItsFiftiethConnection) {
    inRange({"cafe"});
    LogCapture log;
    for (int i = 1; i <= 101; ++i) {
        m_history.addConnection(ssidOf("cafe"), {}, m_networks);
        const bool isOver = log.text().find("entries overflow, clear all entries.\n") != std::string::npos;
        EXPECT_EQ(isOver, i == 51 || i == 101) << i;
    }
}

TEST_F(EngineMemory, ACertificateHasOneAttemptAPasswordTwoAndAnUnknownCredentialNone) {
    store(1, true, CRED_TYPE_EAP_TLS, kEapMethodTls);
    store(2, true, CRED_TYPE_EAP_TTLS, kEapMethodTtls);
    store(3, true, CRED_TYPE_EAP_TLS, kEapMethodTtls);
    store(4, true, CRED_TYPE_EAP_TTLS, kEapMethodTls);
    const int attempts[] = {0, 1, 2, 1, 1, 0};
    for (std::int32_t id = 0; id <= 5; ++id)
        EXPECT_EQ(attemptsAllowed(id), attempts[id]) << id;
}

TEST_F(EngineMemory, RetriesAreCountedForEachPairAloneAndToldTheLog) {
    LogCapture log;
    m_retries.increaseNumRetries(1, "cafe");
    EXPECT_EQ(log.text(),
              "Increase retry numbers for cred id=1, ssid=cafe\n"
              "\tNot found entry for cred id=1 and ssid=cafe, set retry number to 1.\n"
              "Not found cred2ssid entry: credId=1, ssid=cafe, adding a new entry with numRetries=0\n");
    m_retries.increaseNumRetries(1, "cafe");
    EXPECT_EQ(log.text(),
              "Increase retry numbers for cred id=1, ssid=cafe\n"
              "\tIncrease cred2ssid num retries: credId=1, ssid=cafe, numRetries=1\n\n");
    m_retries.increaseNumRetries(0, "cafe");
    m_retries.setNumRetries(1, kLongest, 7);
    EXPECT_EQ(m_retries.getNumRetries(1, "cafe"), 2U);
    for (const char* other : {"Cafe", "caf", "cafes", "0123456789abcdef0123456789ABCDE", ""})
        EXPECT_EQ(m_retries.getNumRetries(1, other), 0U) << other;
    EXPECT_EQ(m_retries.getNumRetries(0, "cafe"), 0U);
    m_retries.setNumRetries(2, "cafe", 1);
    m_retries.removeAllCredNumRetryEntries(2);
    EXPECT_EQ(m_retries.getNumRetries(2, "cafe"), 0U);
    m_retries.removeNumRetryEntries(1, kLongest);
    EXPECT_EQ(m_retries.getNumRetries(1, kLongest), 0U);
    EXPECT_EQ(m_retries.getNumRetries(1, "cafe"), 2U);
}

TEST_F(EngineMemory, RetriesEndWithTheirNetworkUnlessALongerNameBeginsLikeIt) {
    for (const std::int32_t id : {2, 1})
        for (const char* ssid : {"cafe", "hotel", "bar", "airport"})
            m_retries.setNumRetries(id, ssid, 2);
    inRange({"cafeteria", "bar"});
    LogCapture log;
    m_retries.eraseUnavailableNetworks(m_networks);
    std::string wanted;
    for (const char* ssid : {"hotel", "airport", "hotel", "airport"})
        wanted += std::string("BSS with ssid=") + ssid +
                  " is no longer available, erase the corresponding retry history\n";
    EXPECT_EQ(log.text(), wanted);
    EXPECT_EQ(m_retries.getNumRetries(1, "hotel"), 0U);
    EXPECT_EQ(m_retries.getNumRetries(2, "cafe"), 2U);
}

}  // namespace
}  // namespace vexa::test
