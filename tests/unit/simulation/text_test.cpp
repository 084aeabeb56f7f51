#include "simulation/Text.h"

#include <gtest/gtest.h>

#include "simulation/Guid.h"

namespace vexa::simulation {
namespace {

TEST(Text, WhatIsNoUtf8StandsForItself) {
    struct Case {
        std::string utf8;
        std::u32string points;
    };
    const Case cases[] = {
        {"caf\xC3\xA9", U"caf\u00E9"},       {"\xE2\x82\xAC", U"\u20AC"},
        {"\xF0\x9F\x93\xB6", U"\U0001F4F6"}, {"\xC3", {0xC3}},
        {"\xC0\xAF", {0xC0, 0xAF}},          {"\xED\xA0\x80", {0xED, 0xA0, 0x80}},
        {"a\xE2\x82", {'a', 0xE2, 0x82}},
    };
    for (const Case& c : cases)
        EXPECT_EQ(codePoints(c.utf8), c.points) << hexText(Bytes(c.utf8.begin(), c.utf8.end()));
}

TEST(Text, NarrowTextHasOneByteForEachCharacter) {
    EXPECT_EQ(latin1("caf\xC3\xA9 \xE2\x82\xAC"), "caf\xE9 ?");
    EXPECT_EQ(utf16("\xF0\x9F\x93\xB6"), u"\xD83D\xDCF6");
    EXPECT_EQ(utf8(U"\u20AC\U0001F4F6"), "\xE2\x82\xAC\xF0\x9F\x93\xB6");
}

TEST(Text, HexIsReadInEitherCaseAndWrittenInLower) {
    EXPECT_EQ(bytesFromHex("00fFA5"), (Bytes{0x00, 0xFF, 0xA5}));
    EXPECT_EQ(hexText(Bytes{0x00, 0xFF, 0xA5}), "00ffa5");
    for (const char* wrong : {"0", "0g", "00 1", "0x"})
        EXPECT_FALSE(bytesFromHex(wrong)) << wrong;
}

TEST(Text, AGuidHasOneForm) {
    const auto guid = guidFromText("{6b1E8A4C-5D2F-4E0B-9C37-1F5D00000001}");
    ASSERT_TRUE(guid);
    EXPECT_TRUE(sameGuid(*guid, {0x6B1E8A4C, 0x5D2F, 0x4E0B, {0x9C, 0x37, 0x1F, 0x5D, 0, 0, 0, 1}}));
    for (const char* wrong :
         {"", "6B1E8A4C-5D2F-4E0B-9C37-1F5D00000001", "{6B1E8A4C-5D2F-4E0B-9C37-1F5D0000000}",
          "{6B1E8A4C-5D2F-4E0B-9C37-1F5D0000000g}", "{6B1E8A4C 5D2F-4E0B-9C37-1F5D00000001}"}) {
        EXPECT_FALSE(guidFromText(wrong)) << wrong;
    }
}

}  // namespace
}  // namespace vexa::simulation
