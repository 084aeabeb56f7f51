#include "hotspot/CredentialMatching.h"

#include <gtest/gtest.h>

#include "unit/hotspot/LogCapture.h"
#include "unit/hotspot/WireBytes.h"

namespace vexa::test {
namespace {

using platform::LockGuard;

constexpr const char* kOtherMethod = "\t###Realm match, but EAP method doesn't match.###";

class Matching : public testing::Test {
protected:
    Matching() ACQUIRE(g_hs20Lock) { g_hs20Lock.lock(); }
    ~Matching() override RELEASE(g_hs20Lock) { g_hs20Lock.unlock(); }

    Credential& store(std::int32_t id, const std::wstring& realm, std::int32_t method, std::int32_t priority)
        REQUIRES(g_hs20Lock) {
        auto credential =
            std::make_unique<Credential>(id, L"PC\\user", CRED_TYPE_EAP_TTLS, CRED_ACCESS_ALL_USER);
        credential->m_realm = realm;
        credential->m_eapMethod = method;
        credential->m_username = L"u";
        credential->m_password = L"p";
        Credential& stored = *credential;
        m_table.appendUnplaced(std::move(credential));
        stored.m_priority = priority;
        return stored;
    }

    // The ids of what fits a network with these realms.
    std::string found(const std::vector<RealmInfo>& realms) REQUIRES(g_hs20Lock) {
        m_network.m_realms = realms;
        std::string ids;
        for (const Credential* credential : CredentialMatcher(m_table).findCredentialsForNetwork(m_network))
            ids += (ids.empty() ? "" : " ") + std::to_string(credential->m_id);
        return ids;
    }

    std::int32_t byConsortium() REQUIRES(g_hs20Lock) {
        const Credential* const credential = findRoamingConsortiumCredential(m_table, m_network);
        return credential == nullptr ? 0 : credential->m_id;
    }

    CredentialTable m_table;
    Hs20Network m_network{Hs20BssRecord{{1, 2, 3, 4, 5, 6}, "x", 1, 2, 1}};
};

TEST_F(Matching, ARealmMatchesWholeAndWithItsCase) {
    store(1, L"example.com", kEapMethodTtls, 1);
    for (const char* other : {"Example.com", "sub.example.com", "com", "example.co", "example.com.", ""})
        EXPECT_EQ(found({{2, other}}), "") << other;
    EXPECT_EQ(found({{2, "example.com"}}), "1");
    EXPECT_EQ(found({}), "");
}

TEST_F(Matching, AnotherMethodLeavesALineForEachEntryAndALaterEntryStillHits) {
    store(1, L"a", kEapMethodTtls, 1);
    LogCapture log;
    EXPECT_EQ(found({{1, "a"}, {2, "a"}}), "1");
    EXPECT_EQ(log.lines(), std::vector<std::string>{kOtherMethod});
    EXPECT_EQ(found({{1, "a"}, {1, "b"}, {1, "a"}}), "");
    EXPECT_EQ(log.lines(), (std::vector<std::string>{kOtherMethod, kOtherMethod}));
}

TEST_F(Matching, AnIncompleteCredentialIsPassedOverWithoutALine) {
    store(1, L"a", kEapMethodTtls, 1).m_password.clear();
    store(2, L"a", kEapMethodTtls, 1).m_username.clear();
    Credential& tls = store(3, L"a", kEapMethodTls, 1);
    tls.m_username.clear();
    tls.m_password.clear();
    LogCapture log;
    EXPECT_EQ(found({{2, "a"}}), "");
    EXPECT_EQ(log.lines(), std::vector<std::string>{kOtherMethod});
    EXPECT_EQ(found({{1, "a"}}), "3");
}

TEST_F(Matching, AMethodThatIsNeitherOfTheTwoNeverFits) {
    store(1, L"a", 3, 1);
    store(2, L"a", 0, 1);
    EXPECT_EQ(found({{1, "a"}, {2, "a"}, {3, "a"}, {0, "a"}}), "");
}

TEST_F(Matching, ACredentialWithoutRealmIsSkipped) {
    store(1, L"", kEapMethodTtls, 1);
    LogCapture log;
    EXPECT_EQ(found({{2, ""}, {1, ""}}), "");
    EXPECT_TRUE(log.lines().empty());
}

TEST_F(Matching, ACredentialIsFoundOnceHoweverManyEntriesHit) {
    store(1, L"a", kEapMethodTtls, 1);
    EXPECT_EQ(found({{2, "a"}, {2, "b"}, {2, "a"}}), "1");
}

TEST_F(Matching, TheResultIsSortedByPriorityAndStableAmongEquals) {
    store(1, L"a", kEapMethodTtls, 5);
    store(2, L"a", kEapMethodTtls, 2);
    store(3, L"a", kEapMethodTtls, 7);
    store(4, L"a", kEapMethodTtls, 2);
    store(5, L"a", kEapMethodTtls, -1);
    EXPECT_EQ(found({{2, "a"}}), "5 2 4 1 3");
}

TEST_F(Matching, ItStaysStableBeyondAnyLength) {
    std::string expected;
    for (std::int32_t priority = 0; priority < 3; ++priority)
        for (std::int32_t id = 1; id <= 100; ++id)
            if ((id * 7) % 3 == priority) expected += (expected.empty() ? "" : " ") + std::to_string(id);
    for (std::int32_t id = 1; id <= 100; ++id)
        store(id, L"a", kEapMethodTtls, (id * 7) % 3);
    EXPECT_EQ(found({{2, "a"}}), expected);
}

TEST_F(Matching, ARealmOf256CharactersMatchesNothingAndOneOf255Does) {
    store(1, std::wstring(255, L'a'), kEapMethodTtls, 1);
    store(2, std::wstring(256, L'a'), kEapMethodTtls, 2);
    EXPECT_EQ(found({{2, std::string(255, 'a')}, {2, std::string(256, 'a')}}), "1");
}

TEST_F(Matching, ARealmIsComparedByteForByteAndOneThatHasNoBytesCountsAsEmpty) {
    store(1, L"caf\u00e9", kEapMethodTtls, 1);
    store(2, L"\u4e2d\u6587", kEapMethodTtls, 2);
    EXPECT_EQ(found({{2, "caf\xe9"}}), "1");
    EXPECT_EQ(found({{2, "caf\xc3\xa9"}}), "");
    EXPECT_EQ(found({{2, "\xe4\xb8\xad\xe6\x96\x87"}}), "");
    EXPECT_EQ(found({{2, ""}}), "2");
}

TEST_F(Matching, AHomeProviderIsFoundInTheDomainListWhateverItsCase) {
    store(1, L"a", kEapMethodTtls, 1).m_homeSpFqdn = L"Home.Example";
    store(2, L"b", kEapMethodTtls, 2).m_homeSpFqdn = L"second.example";
    struct Case {
        const char* what;
        Block list;
        bool isHome;
    };
    const Case cases[] = {
        {"only", bytesOfHex("0c") + bytesOfText("home.example"), true},
        {"behind another",
         bytesOfHex("01") + bytesOfText("x") + bytesOfHex("0c") + bytesOfText("HOME.EXAMPLE"), true},
        {"of the second credential", bytesOfHex("0e") + bytesOfText("second.example"), true},
        {"behind an empty name", bytesOfHex("00 0c") + bytesOfText("home.example"), true},
        {"a longer name", bytesOfHex("0e") + bytesOfText("a.home.example"), false},
        {"a shorter name", bytesOfHex("0b") + bytesOfText("ome.example"), false},
        {"cut short", bytesOfHex("0c") + bytesOfText("home.exampl"), false},
        {"behind one that is cut short", bytesOfHex("ff 0c") + bytesOfText("home.example"), false},
        {"before one that is cut short", bytesOfHex("0c") + bytesOfText("home.example") + bytesOfHex("05 61"),
         true},
        {"a length alone", bytesOfHex("0c"), false},
        {"nothing", {}, false},
    };
    for (const Case& c : cases)
        EXPECT_EQ(isHomeSpNetwork(m_table, c.list), c.isHome) << c.what;
}

TEST_F(Matching, TheSearchForAHomeProviderLeavesItsLines) {
    store(1, L"a", kEapMethodTtls, 1);
    store(2, L"b", kEapMethodTtls, 2).m_homeSpFqdn = L"home.example";
    LogCapture log;
    EXPECT_FALSE(isHomeSpNetwork(m_table, bytesOfHex("02 6162")));
    EXPECT_EQ(log.text(),
              "Interworking: Search for match with home SP FQDN home.example\n"
              "Interworking: AP domain name 61 62\n"
              "Interworking: AP domain nameab\n");
    EXPECT_FALSE(isHomeSpNetwork(m_table, {}));
    EXPECT_TRUE(log.lines().empty());
}

TEST_F(Matching, AHomeProviderOf256CharactersMatchesNothing) {
    store(1, L"a", kEapMethodTtls, 1).m_homeSpFqdn = std::wstring(256, L'a');
    EXPECT_FALSE(isHomeSpNetwork(m_table, bytesOfHex("ff") + bytesOfText(std::string(255, 'a'))));
    store(2, L"a", kEapMethodTtls, 1).m_homeSpFqdn = std::wstring(255, L'a');
    EXPECT_TRUE(isHomeSpNetwork(m_table, bytesOfHex("ff") + bytesOfText(std::string(255, 'A'))));
}

TEST_F(Matching, WithoutCredentialsNothingIsHome) {
    EXPECT_FALSE(isHomeSpNetwork(m_table, bytesOfHex("0161")));
}

TEST(RoamingConsortiumElement, HasThreeOrganisationsAndEachNeedsItsOwnLength) {
    const Block element =
        bytesOfHex("6f 0e 00 53") + bytesOfText("abc") + bytesOfText("defgh") + bytesOfText("ijkl");
    for (const char* id : {"abc", "defgh", "ijkl"})
        EXPECT_TRUE(roamingConsortiumElementMatch(element, id)) << id;
    for (const char* id : {"def", "ab", "ijk", "ijklm", "ABC", "abcdefgh", ""})
        EXPECT_FALSE(roamingConsortiumElementMatch(element, id)) << id;
}

TEST(RoamingConsortiumElement, ThatIsCutShortNamesNobody) {
    EXPECT_FALSE(roamingConsortiumElementMatch({}, "abc"));
    EXPECT_FALSE(roamingConsortiumElementMatch(bytesOfHex("6f 00"), ""));
    EXPECT_FALSE(roamingConsortiumElementMatch(bytesOfHex("6f 01 00"), ""));
    EXPECT_FALSE(roamingConsortiumElementMatch(bytesOfHex("6f 04 00 03 6162"), "ab"));
    EXPECT_FALSE(roamingConsortiumElementMatch(bytesOfHex("6f 06 00 33 61626364"), "abc"));
}

TEST(RoamingConsortiumElement, WithoutABehindTheSecondHasNoThirdOrganisation) {
    const Block element = bytesOfHex("6f 05 00 03 616263");
    EXPECT_TRUE(roamingConsortiumElementMatch(element, "abc"));
    EXPECT_TRUE(roamingConsortiumElementMatch(element, "")) << "the second has length 0";
    EXPECT_FALSE(roamingConsortiumElementMatch(bytesOfHex("6f 04 00 11 6162"), ""));
}

TEST_F(Matching, AConsortiumIsLookedForInTheBeaconAndInTheAnqpList) {
    store(1, L"a", kEapMethodTtls, 3).m_roamingConsortium = L"abc";
    EXPECT_EQ(byConsortium(), 0);
    m_network.m_anqpRoamingConsortium = bytesOfHex("02 6162 03 616263");
    EXPECT_EQ(byConsortium(), 1);
    m_network.m_anqpRoamingConsortium = bytesOfHex("05 616263");
    EXPECT_EQ(byConsortium(), 0) << "a duple that is cut short";
    m_network.m_anqpRoamingConsortium.clear();
    m_network.m_ies = bytesOfHex("00 02 7878 6f 05 00 03 616263");
    EXPECT_EQ(byConsortium(), 1);
    m_network.m_ies = bytesOfHex("00 09 7878 6f 05 00 03 616263");
    EXPECT_EQ(byConsortium(), 0) << "an element before it that runs past the end";
    m_network.m_ies = bytesOfHex("6f 02 00 00 6f 05 00 03 616263");
    EXPECT_EQ(byConsortium(), 0) << "the first element of this kind is the one";
    m_network.m_ies = bytesOfHex("6f");
    EXPECT_EQ(byConsortium(), 0);
}

TEST_F(Matching, OfSeveralConsortiaTheSmallestPriorityWinsAndTheEarliestAmongEquals) {
    store(1, L"a", kEapMethodTtls, 3).m_roamingConsortium = L"abc";
    store(2, L"a", kEapMethodTtls, 2).m_roamingConsortium = L"abc";
    store(3, L"a", kEapMethodTtls, 2).m_roamingConsortium = L"abc";
    store(4, L"a", kEapMethodTtls, 1).m_roamingConsortium = L"abd";
    store(5, L"a", kEapMethodTtls, 0);
    m_network.m_anqpRoamingConsortium = bytesOfHex("03 616263");
    EXPECT_EQ(byConsortium(), 2);
}

TEST_F(Matching, AConsortiumIsNotDecodedAndHasItsLimitToo) {
    store(1, L"a", kEapMethodTtls, 1).m_roamingConsortium = L"506F9A";
    m_network.m_anqpRoamingConsortium = bytesOfHex("03 506f9a");
    EXPECT_EQ(byConsortium(), 0);
    m_network.m_anqpRoamingConsortium = bytesOfHex("06 353036463941");
    EXPECT_EQ(byConsortium(), 1);
    store(2, L"a", kEapMethodTtls, 0).m_roamingConsortium = std::wstring(256, L'a');
    m_network.m_anqpRoamingConsortium = bytesOfHex("ff") + bytesOfText(std::string(255, 'a'));
    EXPECT_EQ(byConsortium(), 0);
}

}  // namespace
}  // namespace vexa::test
