#include "simulation/text/Text.h"

#include <gtest/gtest.h>

namespace vexa::simulation {
namespace {

TEST(Text, WhatIsNoUtf8StandsForItself) {
    const struct {
        std::string utf8;
        std::u32string points;
    } cases[] = {
        {"caf\xC3\xA9 \xE2\x82\xAC", U"caf\u00E9 \u20AC"},
        {"\xF0\x9F\x93\xB6", U"\U0001F4F6"},
        {"\xC3", {0xC3}},
        {"\xC0\xAF", {0xC0, 0xAF}},
        {"\xED\xA0\x80", {0xED, 0xA0, 0x80}},
        {"a\xE2\x82", {'a', 0xE2, 0x82}},
    };
    for (const auto& [utf8, points] : cases)
        EXPECT_EQ(codePoints(utf8), points) << utf8;
}

TEST(Text, IsWrittenInEveryWidth) {
    EXPECT_EQ(latin1("caf\xC3\xA9 \xE2\x82\xAC"), "caf\xE9 ?");
    EXPECT_EQ(utf16("\xF0\x9F\x93\xB6"), u"\xD83D\xDCF6");
}

}  // namespace
}  // namespace vexa::simulation
