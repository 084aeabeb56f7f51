#include "hotspot/NaiRealmParser.h"

#include <gtest/gtest.h>

#include "hotspot/Hs20Network.h"
#include "unit/hotspot/LogCapture.h"
#include "unit/hotspot/WireBytes.h"

namespace vexa::test {
namespace {

using platform::LockGuard;

constexpr const char* kKept = "kept.example TLS";

// What a network that had one realm shows after these bytes came.
std::string realmsAfter(const Block& list) {
    const LockGuard lock(g_hs20Lock);
    Hs20Network network({{1, 2, 3, 4, 5, 6}, "Airport", 1, 2, 1});
    network.m_realms = {{1, "kept.example"}};
    network.m_anqpNaiRealm = list;
    network.parseRealmList();
    std::string text;
    for (const RealmInfo& realm : network.m_realms)
        text += (text.empty() ? "" : ", ") + realm.m_realm + (realm.m_eapType == 2 ? " TTLS" : " TLS");
    return text;
}

constexpr const char* kHead =
    "Parsing NAI Realm list from 01:02:03:04:05:06\n"
    "\tParsing NAI Realm...\n";

TEST(NaiRealms, EachBoundIsCheckedInItsOrderAndKeepsTheOldList) {
    struct Case {
        const char* what;
        const char* hex;
        const char* log;
    };
    const Case cases[] = {
        {"half a count", "01", ""},
        {"a count of none", "0000", "\tNAI Realm Count: 0\n"},
        {"a count of none with more behind", "0000 ffff", "\tNAI Realm Count: 0\n"},
        {"three entries in 14 bytes", "0300 0300000000 0300000000 03000000",
         "\tNAI Realm Count: 3\n"
         "Invalid NAI Realm Count 3 - not enough data (14 octets) for that many realms\n"},
        {"the highest count", "ffff 0300000000",
         "\tNAI Realm Count: 65535\n"
         "Invalid NAI Realm Count 65535 - not enough data (5 octets) for that many realms\n"},
        {"a second entry of 3 bytes", "0200 0500 00 01 61 00 00 030000",
         "\tNAI Realm Count: 2\n\tNAI Realm=a\nNo room for NAI Realm Data fixed fields\n"},
        {"a length of 2", "0100 0200 00 00 00",
         "\tNAI Realm Count: 1\nNo room for NAI Realm Data (len=2; left=3)\n"},
        {"a length behind the list", "0100 0400 00 00 00",
         "\tNAI Realm Count: 1\nNo room for NAI Realm Data (len=4; left=3)\n"},
        {"a realm behind its entry, not behind the list", "0100 0300 00 02 61 62 00",
         "\tNAI Realm Count: 1\nNo room for NAI Realm (len=2; left=1)\n"},
        {"a realm that leaves no method count", "0100 0300 00 01 61",
         "\tNAI Realm Count: 1\n\tNAI Realm=a\nNo room for EAP Method Count\n"},
        {"a method in 2 bytes", "0100 0600 00 01 61 01 02 0d",
         "\tNAI Realm Count: 1\n\tNAI Realm=a\nNo room for EAP Methods\n"},
        {"a second method without bytes", "0100 0a00 00 01 61 02 05 0d 00 00 00 00",
         "\tNAI Realm Count: 1\n\tNAI Realm=a\n\t\tEAP Method: len=5 method=13 auth_count=0\n"
         "No room for EAP Method fixed fields\n"},
        {"a method of length 1", "0100 0700 00 01 61 01 01 0d 00",
         "\tNAI Realm Count: 1\n\tNAI Realm=a\nNo room for EAP Method subfield\n"},
        {"a method behind its entry", "0100 0700 00 01 61 01 03 0d 00 00",
         "\tNAI Realm Count: 1\n\tNAI Realm=a\nNo room for EAP Method subfield\n"},
        {"a parameter without a length", "0100 0800 00 01 61 01 03 15 01 02",
         "\tNAI Realm Count: 1\n\tNAI Realm=a\n\t\tEAP Method: len=3 method=21 auth_count=1\n"
         "No room for Authentication Parameter subfield\n"},
        {"a value behind the entry", "0100 0900 00 01 61 01 04 15 01 02 01 01",
         "\tNAI Realm Count: 1\n\tNAI Realm=a\n\t\tEAP Method: len=4 method=21 auth_count=1\n"
         "No room for Authentication Parameter subfield\n"},
    };
    LogCapture log;
    for (const Case& c : cases) {
        EXPECT_EQ(realmsAfter(bytesOfHex(c.hex)), kKept) << c.what;
        EXPECT_EQ(log.text(), std::string(kHead) + c.log) << c.what;
    }
}

TEST(NaiRealms, WithoutAnyBytesNothingIsParsed) {
    LogCapture log;
    EXPECT_EQ(realmsAfter({}), kKept);
    EXPECT_EQ(log.text(),
              "Parsing NAI Realm list from 01:02:03:04:05:06\n"
              "The NAI realm buffer is empty, nothing will be parsed.\n");
}

TEST(NaiRealms, EachNameGetsEachSupportedMethodInOrder) {
    const Block list =
        realmList({realmData("one.example;two.example", {eapMethod(13), eapMethod(21), eapMethod(18)})});
    LogCapture log;
    EXPECT_EQ(realmsAfter(list), "one.example TLS, one.example TTLS, two.example TLS, two.example TTLS");
    EXPECT_EQ(log.text(), std::string(kHead) +
                              "\tNAI Realm Count: 1\n"
                              "\tNAI Realm=one.example;two.example\n"
                              "\t\tEAP Method: len=2 method=13 auth_count=0\n"
                              "\t\tEAP Method: len=2 method=21 auth_count=0\n"
                              "\t\tEAP Method: len=2 method=18 auth_count=0\n"
                              "ERROR: Invalid EAP type.\n"
                              "ERROR: Invalid EAP type.\n"
                              "\tWe have parsed 4 realms:\n"
                              "\t\tone.example EAP-TLS\n"
                              "\t\tone.example EAP-TTLS\n"
                              "\t\ttwo.example EAP-TLS\n"
                              "\t\ttwo.example EAP-TTLS\n");
}

TEST(NaiRealms, NamesAreSplitAtSemicolons) {
    struct Case {
        std::string text;
        const char* names;
    };
    const Case cases[] = {
        {"", " TLS"},
        {"one", "one TLS"},
        {"one;two", "one TLS, two TLS"},
        {"one;two;", "one TLS, two TLS"},
        {";one", " TLS, one TLS"},
        {"one;;two", "one TLS,  TLS, two TLS"},
        {";", " TLS"},
        {";;", " TLS,  TLS"},
        {"one,two three", "one,two three TLS"},
        {std::string("one\0;two", 8), "one TLS"},
        {std::string("\0one", 4), " TLS"},
        {"\xff\xfe", "\xff\xfe TLS"},
    };
    for (const Case& c : cases)
        EXPECT_EQ(realmsAfter(realmList({realmData(c.text, {eapMethod(13)})})), c.names) << c.text;
}

TEST(NaiRealms, ARealmOfTheLongestLengthIsKeptWhole) {
    const std::string name(255, 'r');
    EXPECT_EQ(realmsAfter(realmList({realmData(name, {eapMethod(21)})})), name + " TTLS");
}

TEST(NaiRealms, EntriesAreNotDeduplicatedAndAllStandInOrder) {
    EXPECT_EQ(realmsAfter(realmList({realmData("b", {eapMethod(21)}), realmData("a", {eapMethod(13)}),
                                     realmData("b", {eapMethod(21)})})),
              "b TTLS, a TLS, b TTLS");
}

TEST(NaiRealms, AListWithoutSupportedMethodsEmptiesTheOldOne) {
    EXPECT_EQ(realmsAfter(realmList({realmData("sim.example", {eapMethod(18), eapMethod(50)})})), "");
    EXPECT_EQ(realmsAfter(realmList({realmData("bare.example", {})})), "");
}

TEST(NaiRealms, ABadSecondEntryLosesTheFirstAsWell) {
    const Block good = realmData("good.example", {eapMethod(13)});
    EXPECT_EQ(realmsAfter(realmList({good, bytesOfHex("0200 00 00 00")})), kKept);
}

TEST(NaiRealms, BytesBehindTheLastEntryAreIgnored) {
    EXPECT_EQ(realmsAfter(realmList({realmData("a", {eapMethod(13)})}) + bytesOfHex("ffffff")), "a TLS");
}

TEST(NaiRealms, ParametersMayRunBeyondTheirMethodButNotBeyondTheEntry) {
    // The first method claims 2 bytes, so that its parameter shares its bytes with the second method.
    EXPECT_EQ(realmsAfter(bytesOfHex("0100 0c00 00 01 61 02 02 15 01 02 0d 00 00 00")), kKept);
    EXPECT_EQ(realmsAfter(bytesOfHex("0100 0a00 00 01 61 02 02 15 01 02 01 00")), "a TTLS");
    EXPECT_EQ(realmsAfter(bytesOfHex("0100 0a00 00 01 61 02 02 15 01 02 00 0d")), kKept)
        << "the second method claims 13 parameters and has room for none";
}

TEST(NaiRealms, TheNextMethodBeginsWhereTheLengthSays) {
    // Five bytes of padding behind the only parameter, which would read as methods.
    const Block padded = bytesOfHex("08 0d 01 02 01 04 ff ff ff");
    EXPECT_EQ(realmsAfter(realmList({realmData("a", {padded, eapMethod(21)})})), "a TLS, a TTLS");
}

TEST(NaiRealms, ParametersAreReadAndUnknownOnesNamed) {
    const Block method =
        eapMethod(21, {authParameter(2, bytesOfHex("04")), authParameter(3, bytesOfHex("1a")),
                       authParameter(5, bytesOfHex("07")), authParameter(6, bytesOfHex("0809")),
                       authParameter(9, bytesOfHex("aabb")), authParameter(1, {})});
    LogCapture log;
    const auto realms = parseNaiRealmList(realmList({realmData("a", {method, eapMethod(13)})}));
    ASSERT_TRUE(realms);
    const NaiRealmEap& eap = (*realms)[0].eap[0];
    EXPECT_EQ(eap.method, 21);
    EXPECT_EQ(eap.innerNonEap, 4U);
    EXPECT_EQ(eap.innerMethod, 0x1a);
    EXPECT_EQ(eap.credType, 7);
    EXPECT_EQ(eap.tunneledCredType, 8);
    EXPECT_EQ((*realms)[0].eap[1].innerMethod, 0);
    const std::string text = log.text();
    EXPECT_NE(text.find("Unsupported Authentication Parameter: id=9 len=2\n"
                        "Authentication Parameter Value aa bb\n"),
              std::string::npos)
        << text;
    EXPECT_NE(text.find("Unsupported Authentication Parameter: id=1 len=0\n"), std::string::npos) << text;
}

TEST(NaiRealms, AKnownParameterWithoutAValueLeavesWhatWasThere) {
    const Block method = eapMethod(21, {authParameter(2, bytesOfHex("04")), authParameter(2, {}),
                                        authParameter(3, {}), authParameter(5, {}), authParameter(6, {})});
    const auto realms = parseNaiRealmList(realmList({realmData("a", {method})}));
    ASSERT_TRUE(realms);
    EXPECT_EQ((*realms)[0].eap[0].innerNonEap, 4U);
    EXPECT_EQ((*realms)[0].eap[0].innerMethod, 0);
}

}  // namespace
}  // namespace vexa::test
