#include "hotspot/CredentialMatching.h"

#include <gtest/gtest.h>

#include "unit/hotspot/LogCapture.h"
#include "unit/hotspot/WireBytes.h"

namespace vexa::test {
namespace {

constexpr const char* kOtherMethod = "\t###Realm match, but EAP method doesn't match.###";

class Matching : public testing::Test {
protected:
    Credential& store(std::int32_t id, const std::wstring& realm, std::int32_t priority = 1,
                      std::int32_t method = kEapMethodTtls) {
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
    std::string found(const std::vector<RealmInfo>& realms) {
        m_network.m_realms = realms;
        std::string ids;
        for (const Credential* credential : CredentialMatcher(m_table).findCredentialsForNetwork(m_network))
            ids += (ids.empty() ? "" : " ") + std::to_string(credential->m_id);
        return ids;
    }

    std::int32_t byConsortium() {
        const Credential* const credential = findRoamingConsortiumCredential(m_table, m_network);
        return credential == nullptr ? 0 : credential->m_id;
    }

    CredentialTable m_table;
    Hs20Network m_network{Hs20BssRecord{{1, 2, 3, 4, 5, 6}, "x", 1, 2, 1}};
};

TEST_F(Matching, ARealmMatchesWholeByteForByteAndWithItsCase) {
    store(1, L"example.com");
    store(2, L"caf\u00e9");
    store(3, L"\u4e2d\u6587");
    store(4, L"");
    store(5, std::wstring(255, L'a'));
    store(6, std::wstring(256, L'a'));
    for (const char* other : {"Example.com", "sub.example.com", "com", "example.co", "example.com."})
        EXPECT_EQ(found({{2, other}}), "") << other;
    EXPECT_EQ(found({{2, "example.com"}}), "1");
    EXPECT_EQ(found({{2, "caf\xe9"}}), "2");
    EXPECT_EQ(found({{2, ""}, {2, "?"}, {2, "??"}}), "") << "a realm that can't be told fits no stranger";
    EXPECT_EQ(found({{2, std::string(255, 'a')}, {2, std::string(256, 'a')}}), "5");
}

TEST_F(Matching, AnotherMethodLeavesALineForEachEntryAndALaterEntryStillHits) {
    store(1, L"a");
    LogCapture log;
    EXPECT_EQ(found({{1, "a"}, {2, "a"}, {2, "a"}}), "1");
    EXPECT_EQ(log.lines(), std::vector<std::string>{kOtherMethod});
    EXPECT_EQ(found({{1, "a"}, {1, "b"}, {1, "a"}}), "");
    EXPECT_EQ(log.lines(), (std::vector<std::string>{kOtherMethod, kOtherMethod}));
}

TEST_F(Matching, AnIncompleteCredentialIsPassedOverWithoutALine) {
    store(1, L"a").m_password.clear();
    store(2, L"a").m_username.clear();
    Credential& tls = store(3, L"a", 1, kEapMethodTls);
    tls.m_username.clear();
    tls.m_password.clear();
    LogCapture log;
    EXPECT_EQ(found({{2, "a"}}), "");
    EXPECT_EQ(log.lines(), std::vector<std::string>{kOtherMethod});
    EXPECT_EQ(found({{1, "a"}}), "3");
    store(4, L"b", 1, 3);
    EXPECT_EQ(found({{1, "b"}, {2, "b"}, {3, "b"}}), "") << "a method that is neither of the two";
}

TEST_F(Matching, TheResultIsSortedByPriorityAndStableAmongEquals) {
    std::string expected;
    for (std::int32_t priority = -1; priority < 2; ++priority)
        for (std::int32_t id = 1; id <= 100; ++id)
            if ((id * 7) % 3 - 1 == priority) expected += (expected.empty() ? "" : " ") + std::to_string(id);
    for (std::int32_t id = 1; id <= 100; ++id)
        store(id, L"a", (id * 7) % 3 - 1);
    EXPECT_EQ(found({{2, "a"}}), expected);
}

Block duple(std::string_view text) {
    return Block{static_cast<std::byte>(text.size())} + bytesOfText(text);
}

TEST_F(Matching, AHomeProviderIsFoundInTheDomainListWhateverItsCase) {
    EXPECT_FALSE(isHomeSpNetwork(m_table, duple("a")));
    store(1, L"a").m_homeSpFqdn = L"Home.Example";
    store(2, L"b").m_homeSpFqdn = L"second.example";
    store(3, L"c").m_homeSpFqdn = std::wstring(255, L'a');
    store(4, L"d").m_homeSpFqdn = std::wstring(256, L'b');
    const std::tuple<const char*, Block, bool> cases[] = {
        {"only", duple("home.example"), true},
        {"behind another", duple("x") + duple("HOME.EXAMPLE"), true},
        {"of the second credential", duple("second.example"), true},
        {"behind an empty name", duple("") + duple("home.example"), true},
        {"a longer name", duple("a.home.example"), false},
        {"a shorter name", duple("ome.example"), false},
        {"cut short", bytesOfHex("0c") + bytesOfText("home.exampl"), false},
        {"behind one that is cut short", bytesOfHex("ff") + duple("home.example"), false},
        {"before one that is cut short", duple("home.example") + bytesOfHex("05 61"), true},
        {"a length alone", bytesOfHex("0c"), false},
        {"nothing", {}, false},
        {"255 characters", duple(std::string(255, 'A')), true},
        {"the first 255 of 256 characters", duple(std::string(255, 'b')), false},
    };
    for (const auto& [what, list, isHome] : cases)
        EXPECT_EQ(isHomeSpNetwork(m_table, list), isHome) << what;
}

TEST_F(Matching, TheSearchForAHomeProviderLeavesItsLines) {
    store(1, L"a");
    store(2, L"b").m_homeSpFqdn = L"home.example";
    LogCapture log;
    EXPECT_FALSE(isHomeSpNetwork(m_table, bytesOfHex("02 6162")));
    EXPECT_EQ(log.text(),
              "Interworking: Search for match with home SP FQDN home.example\n"
              "Interworking: AP domain name 61 62\n"
              "Interworking: AP domain nameab\n");
    EXPECT_FALSE(isHomeSpNetwork(m_table, {}));
    EXPECT_TRUE(log.lines().empty());
}

TEST(RoamingConsortiumElement, HasThreeOrganisationsAndEachNeedsItsOwnLength) {
    const Block element = bytesOfHex("6f 0e 00 53") + bytesOfText("abcdefghijkl");
    for (const char* id : {"abc", "defgh", "ijkl"})
        EXPECT_TRUE(roamingConsortiumElementMatch(element, id)) << id;
    for (const char* id : {"def", "ab", "ijk", "ijklm", "ABC", "abcdefgh", ""})
        EXPECT_FALSE(roamingConsortiumElementMatch(element, id)) << id;
    const Block single = bytesOfHex("6f 05 00 03 616263");
    EXPECT_TRUE(roamingConsortiumElementMatch(single, "abc"));
    EXPECT_TRUE(roamingConsortiumElementMatch(single, "")) << "the second has length 0";
    EXPECT_FALSE(roamingConsortiumElementMatch(bytesOfHex("6f 04 00 11 6162"), "")) << "there is no third";
    const std::pair<const char*, const char*> cutShort[] = {
        {"", "abc"}, {"6f 01 00", ""}, {"6f 04 00 03 6162", "ab"}, {"6f 06 00 33 61626364", "abc"}};
    for (const auto& [hex, id] : cutShort)
        EXPECT_FALSE(roamingConsortiumElementMatch(bytesOfHex(hex), id)) << hex;
}

TEST_F(Matching, AConsortiumIsLookedForInTheBeaconAndInTheAnqpList) {
    store(1, L"a").m_roamingConsortium = L"abc";
    const std::tuple<const char*, const char*, const char*, std::int32_t> cases[] = {
        {"nothing", "", "", 0},
        {"the second duple", "", "02 6162 03 616263", 1},
        {"a duple that is cut short", "", "05 616263", 0},
        {"a second element", "00 02 7878 6f 05 00 03 616263", "", 1},
        {"an element before it that runs past the end", "00 09 7878 6f 05 00 03 616263", "", 0},
        {"the first element of this kind is the one", "6f 02 00 00 6f 05 00 03 616263", "", 0},
        {"half a head", "6f", "", 0},
        {"digits are no bytes", "", "06 363136323633", 0},
    };
    for (const auto& [what, elements, anqp, found] : cases) {
        m_network.m_ies = bytesOfHex(elements);
        m_network.m_anqpRoamingConsortium = bytesOfHex(anqp);
        EXPECT_EQ(byConsortium(), found) << what;
    }
}

TEST_F(Matching, OfSeveralConsortiaTheSmallestPriorityWinsAndTheEarliestAmongEquals) {
    store(1, L"a", 3).m_roamingConsortium = L"abc";
    store(2, L"a", 2).m_roamingConsortium = L"abc";
    store(3, L"a", 2).m_roamingConsortium = L"abc";
    store(4, L"a", 1).m_roamingConsortium = L"abd";
    store(5, L"a", 0);
    m_network.m_anqpRoamingConsortium = duple("abc");
    EXPECT_EQ(byConsortium(), 2);
    store(6, L"a", 0).m_roamingConsortium = std::wstring(256, L'a');
    m_network.m_anqpRoamingConsortium = duple(std::string(255, 'a'));
    EXPECT_EQ(byConsortium(), 0) << "one of 256 characters";
}

}  // namespace
}  // namespace vexa::test
