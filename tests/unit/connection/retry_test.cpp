#include <gtest/gtest.h>

#include "config/CredentialTable.h"
#include "connection/NetworkRetryHelper.h"
#include "hotspot/Hs20NetworkList.h"
#include "unit/hotspot/LogCapture.h"

namespace vexa::test {
namespace {

class Retries : public testing::Test {
protected:
    Retries() ACQUIRE(g_hs20Lock) { g_hs20Lock.lock(); }
    ~Retries() override RELEASE(g_hs20Lock) { g_hs20Lock.unlock(); }

    void store(std::int32_t id, std::int32_t type, std::int32_t method) REQUIRES(g_hs20Lock) {
        auto credential = std::make_unique<Credential>(id, L"PC\\user", type, CRED_ACCESS_ALL_USER);
        credential->m_eapMethod = method;
        m_table.appendUnplaced(std::move(credential));
    }

    int attemptsAllowed(std::int32_t id) REQUIRES(g_hs20Lock) {
        int attempts = 0;
        for (; attempts < 5 && m_retries.isRetryAllowed(m_table, id, "cafe"); ++attempts)
            m_retries.increaseNumRetries(id, "cafe");
        return attempts;
    }

    void inRange(const std::vector<std::string>& ssids) REQUIRES(g_hs20Lock) {
        std::vector<Hs20BssRecord> records;
        for (const std::string& ssid : ssids)
            records.push_back({{1, 2, 3, 4, 5, static_cast<std::uint8_t>(records.size())}, ssid, 1, 2, 1});
        m_networks.replace(records);
    }

    CredentialTable m_table;
    Hs20NetworkList m_networks;
    NetworkRetryHelper m_retries;
};

TEST_F(Retries, ACertificateHasOneAttemptAndAPasswordTwo) {
    struct Case {
        std::int32_t type;
        std::int32_t method;
        int attempts;
    };
    const Case cases[] = {
        {CRED_TYPE_EAP_TLS, kEapMethodTls, 1},
        {CRED_TYPE_EAP_TTLS, kEapMethodTtls, 2},
        {CRED_TYPE_EAP_TLS, kEapMethodTtls, 1},
        {CRED_TYPE_EAP_TTLS, kEapMethodTls, 1},
        {CRED_TYPE_EAP_SIM, 0, 2},
    };
    std::int32_t id = 0;
    for (const Case& c : cases) {
        store(++id, c.type, c.method);
        EXPECT_EQ(attemptsAllowed(id), c.attempts) << c.type << " " << c.method;
    }
}

TEST_F(Retries, AnUnknownCredentialHasNone) {
    store(1, CRED_TYPE_EAP_TTLS, kEapMethodTtls);
    LogCapture log;
    for (const std::int32_t id : {2, 0, -1})
        EXPECT_FALSE(m_retries.isRetryAllowed(m_table, id, "cafe"));
    EXPECT_EQ(log.text(),
              "ERROR: Cannot get credential with id=2\nERROR: Cannot get credential with id=0\n"
              "ERROR: Cannot get credential with id=-1\n");
}

TEST_F(Retries, AreCountedForEachPairAlone) {
    const std::string longest = "0123456789abcdef0123456789ABCDEF";
    m_retries.increaseNumRetries(1, "cafe");
    m_retries.increaseNumRetries(1, "cafe");
    m_retries.increaseNumRetries(2, "cafe");
    m_retries.setNumRetries(1, longest, 7);
    EXPECT_EQ(m_retries.getNumRetries(1, "cafe"), 2U);
    EXPECT_EQ(m_retries.getNumRetries(2, "cafe"), 1U);
    EXPECT_EQ(m_retries.getNumRetries(1, longest), 7U);
    for (const char* other : {"Cafe", "caf", "cafes", "0123456789abcdef0123456789ABCDE", ""})
        EXPECT_EQ(m_retries.getNumRetries(1, other), 0U) << other;
    m_retries.setNumRetries(0, "cafe", 3);
    m_retries.increaseNumRetries(-1, "cafe");
    EXPECT_EQ(m_retries.getNumRetries(0, "cafe"), 0U);
    EXPECT_EQ(m_retries.getNumRetries(-1, "cafe"), 0U);
}

TEST_F(Retries, TellTheLogHowTheyMove) {
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
    m_retries.setNumRetries(1, "cafe", 0);
    m_retries.removeNumRetryEntries(1, "cafe");
    m_retries.resetNumRetries(1);
    EXPECT_EQ(log.text(), "");
    m_retries.increaseNumRetries(0, "cafe");
    EXPECT_EQ(log.text(), "Increase retry numbers for cred id=0, ssid=cafe\n");
    m_retries.resetAllNumRetries();
    m_retries.removeAllCredNumRetryEntries(3);
    EXPECT_EQ(log.text(), "Enter resetAllNumRetries.\nremoveAllCredNumRetryEntries for CredId=3\n");
}

TEST_F(Retries, ComeBackForAPairACredentialOrAll) {
    const auto fill = [this]() REQUIRES(g_hs20Lock) {
        m_retries.clear();
        for (const std::int32_t id : {1, 2})
            for (const char* ssid : {"a", "b"})
                m_retries.setNumRetries(id, ssid, 2);
    };
    const auto counts = [this]() REQUIRES(g_hs20Lock) {
        std::string text;
        for (const std::int32_t id : {1, 2})
            for (const char* ssid : {"a", "b"})
                text += std::to_string(m_retries.getNumRetries(id, ssid));
        return text;
    };
    fill();
    EXPECT_EQ(counts(), "2222");
    m_retries.removeNumRetryEntries(1, "b");
    EXPECT_EQ(counts(), "2022");
    fill();
    m_retries.removeAllCredNumRetryEntries(2);
    EXPECT_EQ(counts(), "2200");
    fill();
    m_retries.resetNumRetries(1);
    EXPECT_EQ(counts(), "0022");
    fill();
    m_retries.resetAllNumRetries();
    EXPECT_EQ(counts(), "0000");
    LogCapture log;
    m_retries.increaseNumRetries(1, "a");
    EXPECT_NE(log.text().find("numRetries=0\n"), std::string::npos) << "the entries stay";
}

TEST_F(Retries, EndWithTheirNetworkUnlessALongerNameBeginsLikeIt) {
    for (const char* ssid : {"cafe", "hotel", "bar"})
        m_retries.setNumRetries(1, ssid, 2);
    inRange({"cafeteria", "bar"});
    LogCapture log;
    m_retries.eraseUnavailableNetworks(m_networks);
    EXPECT_EQ(log.text(),
              "BSS with ssid=hotel is no longer available, erase the corresponding retry history\n");
    EXPECT_EQ(m_retries.getNumRetries(1, "cafe"), 2U);
    EXPECT_EQ(m_retries.getNumRetries(1, "bar"), 2U);
    EXPECT_EQ(m_retries.getNumRetries(1, "hotel"), 0U);
}

}  // namespace
}  // namespace vexa::test
