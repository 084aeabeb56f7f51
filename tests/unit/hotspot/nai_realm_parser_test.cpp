#include "hotspot/NaiRealmParser.h"

#include <gtest/gtest.h>

#include "hotspot/Hs20Network.h"
#include "unit/hotspot/LogCapture.h"
#include "unit/hotspot/WireBytes.h"

namespace vexa::test {
namespace {

constexpr const char* kKept = "kept.example TLS";

// What a network that had one realm shows after these bytes came.
std::string realmsAfter(const Block& list) {
    Hs20Network network({{1, 2, 3, 4, 5, 6}, "Airport", 1, 2, 1});
    network.m_realms = {{1, "kept.example"}};
    network.m_anqpNaiRealm = list;
    network.parseRealmList();
    std::string text;
    for (const RealmInfo& realm : network.m_realms)
        text += (text.empty() ? "" : ", ") + realm.m_realm + (realm.m_eapType == 2 ? " TTLS" : " TLS");
    return text;
}

int countOf(std::string_view text, std::string_view part) {
    int found = 0;
    for (std::size_t at = text.find(part); at != text.npos; at = text.find(part, at + part.size()))
        ++found;
    return found;
}

const std::string kHead = "Parsing NAI Realm list from 01:02:03:04:05:06\n\tParsing NAI Realm...\n";

std::string counted(int count) {
    return kHead + "\tNAI Realm Count: " + std::to_string(count) + "\n";
}

TEST(NaiRealms, EachBoundIsCheckedInItsOrderAndKeepsTheOldList) {
    const std::string named = counted(1) + "\tNAI Realm=a\n";
    const auto method = [&](const std::string& numbers) {
        return named + "\t\tEAP Method: " + numbers + "\n";
    };
    const std::tuple<const char*, const char*, std::string> cases[] = {
        {"half a count", "01", kHead},
        {"a count of none", "0000", counted(0)},
        {"three entries in 14 bytes", "0300 0300000000 0300000000 03000000",
         counted(3) + "Invalid NAI Realm Count 3 - not enough data (14 octets) for that many realms\n"},
        {"a second entry of 3 bytes", "0200 0500 00 01 61 00 00 030000",
         counted(2) + "\tNAI Realm=a\nNo room for NAI Realm Data fixed fields\n"},
        {"a length of 2", "0100 0200 00 00 00", counted(1) + "No room for NAI Realm Data (len=2; left=3)\n"},
        {"a length of 4", "0100 0400 00 00 00", counted(1) + "No room for NAI Realm Data (len=4; left=3)\n"},
        {"a realm behind its entry, not behind the list", "0100 0300 00 02 61 62 00",
         counted(1) + "No room for NAI Realm (len=2; left=1)\n"},
        {"no method count", "0100 0300 00 01 61", named + "No room for EAP Method Count\n"},
        {"a method in 2 bytes", "0100 0600 00 01 61 01 02 0d", named + "No room for EAP Methods\n"},
        {"a second method without bytes", "0100 0a00 00 01 61 02 05 0d 00 00 00 00",
         method("len=5 method=13 auth_count=0") + "No room for EAP Method fixed fields\n"},
        {"a length of 1", "0100 0700 00 01 61 01 01 0d 00", named + "No room for EAP Method subfield\n"},
        {"a method behind", "0100 0700 00 01 61 01 03 0d 00 00", named + "No room for EAP Method subfield\n"},
        {"a parameter without a length", "0100 0800 00 01 61 01 03 15 01 02",
         method("len=3 method=21 auth_count=1") + "No room for Authentication Parameter subfield\n"},
        {"a value behind the entry", "0100 0900 00 01 61 01 04 15 01 02 01 01",
         method("len=4 method=21 auth_count=1") + "No room for Authentication Parameter subfield\n"},
    };
    LogCapture log;
    for (const auto& [what, hex, lines] : cases) {
        EXPECT_EQ(realmsAfter(bytesOfHex(hex)), kKept) << what;
        EXPECT_EQ(log.text(), lines) << what;
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
    EXPECT_EQ(log.text(), counted(1) +
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
    const std::pair<std::string, std::string> cases[] = {
        {"", " TLS"},
        {"one", "one TLS"},
        {"one;two;", "one TLS, two TLS"},
        {";one", " TLS, one TLS"},
        {"one;;two", "one TLS,  TLS, two TLS"},
        {";", " TLS"},
        {";;", " TLS,  TLS"},
        {"one,two three", "one,two three TLS"},
        {std::string("one\0;two", 8), "one TLS"},
        {std::string(255, '\xff'), std::string(255, '\xff') + " TLS"}};
    for (const auto& [text, names] : cases)
        EXPECT_EQ(realmsAfter(realmList({realmData(text, {eapMethod(13)})})), names) << text;
}

TEST(NaiRealms, ReplaceTheOldOnesByAllOfAGoodListAndByNothingOfABadOne) {
    const Block a = realmData("a", {eapMethod(13)});
    const Block b = realmData("b", {eapMethod(21)});
    // Five bytes of padding behind the only parameter of the first method, which would read as methods.
    const Block padded = bytesOfHex("08 0d 01 02 01 04 ff ff ff");
    const std::tuple<const char*, Block, const char*> cases[] = {
        {"a repeated entry", realmList({b, a, b}), "b TTLS, a TLS, b TTLS"},
        {"other methods", realmList({realmData("sim.example", {eapMethod(18), eapMethod(50)})}), ""},
        {"no methods", realmList({realmData("bare.example", {})}), ""},
        {"a bad second entry", realmList({a, bytesOfHex("0200 00 00 00")}), kKept},
        {"bytes behind", realmList({a}) + bytesOfHex("ffffff"), "a TLS"},
        {"padding", realmList({realmData("a", {padded, eapMethod(21)})}), "a TLS, a TTLS"},
        {"a parameter with the next method", bytesOfHex("0100 0a00 00 01 61 02 02 15 01 02 01 00"), "a TTLS"},
        {"one that takes all of it", bytesOfHex("0100 0c00 00 01 61 02 02 15 01 02 0d 00 00 00"), kKept},
        {"a next method with 13 parameters", bytesOfHex("0100 0a00 00 01 61 02 02 15 01 02 00 0d"), kKept},
    };
    for (const auto& [what, list, realms] : cases)
        EXPECT_EQ(realmsAfter(list), realms) << what;
}

TEST(NaiRealms, OfTooManyTheFirstAreKeptAndOneLineTellsIt) {
    const auto methods = [](std::size_t count, unsigned method) {
        return std::vector<Block>(count, eapMethod(method));
    };
    const auto invalid = methods(150, 18);
    const std::tuple<std::vector<Block>, int, int, int> cases[] = {
        {{realmData("a;b", methods(128, 13))}, 256, 0, 0},
        {{realmData("a;b", methods(128, 13)), realmData("c", methods(1, 13))}, 256, 1, 0},
        {std::vector<Block>(13, realmData(std::string(253, ';'), methods(167, 21))), 256, 1, 0},
        {{realmData(std::string(255, 'x'), methods(255, 13))}, 32, 1, 0},
        {{realmData(";;;a", invalid), realmData("b", methods(2, 13))}, 2, 0, 256},
        {{realmData(std::string(253, ';'), invalid)}, 0, 0, 256},
    };
    for (const auto& [entries, kept, lines, complaints] : cases) {
        LogCapture log;
        const std::string realms = realmsAfter(realmList(entries));
        const std::string text = log.text();
        EXPECT_EQ(countOf(realms, "TLS"), kept);
        EXPECT_EQ(countOf(text, "too many realms, only the first"), lines);
        EXPECT_EQ(countOf(text, "ERROR: Invalid EAP type."), complaints);
    }
}

TEST(NaiRealms, ParametersAreReadWhereTheyHaveAValueAndUnknownOnesNamed) {
    const Block method =
        eapMethod(21, {authParameter(2, bytesOfHex("04")), authParameter(3, bytesOfHex("1a")),
                       authParameter(5, bytesOfHex("07")), authParameter(6, bytesOfHex("0809")),
                       authParameter(9, bytesOfHex("aabb")), authParameter(1, {}), authParameter(2, {}),
                       authParameter(3, {}), authParameter(5, {}), authParameter(6, {})});
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
    EXPECT_NE(log.text().find("Unsupported Authentication Parameter: id=9 len=2\n"
                              "Authentication Parameter Value aa bb\n"
                              "Unsupported Authentication Parameter: id=1 len=0\n"),
              std::string::npos);
}

}  // namespace
}  // namespace vexa::test
