#include <gtest/gtest.h>

#include "client/terminal/LineFit.h"
#include "client/terminal/Nearest.h"
#include "client/terminal/Text.h"
#include "text/Utf8.h"

namespace vexa::client {
namespace {

TEST(Text, WhatIsNoUtf8IsKnown) {
    for (const char* text : {"", "plain", "é", "空港", "😀", "\xEF\xBF\xBD", "\xF4\x8F\xBF\xBF"})
        EXPECT_TRUE(isValidUtf8(text)) << text;
    for (const char* text : {"\x80", "caf\xE9", "\xC3", "\xC0\x80", "\xE0\x80\x80", "\xED\xA0\x80",
                             "\xF4\x90\x80\x80", "\xF8\x88\x80\x80\x80", "a\xFF", "\xE2\x98"})
        EXPECT_FALSE(isValidUtf8(text)) << text;
}

TEST(Text, ColumnsFollowTheWidthOfCharacters) {
    EXPECT_EQ(columnsOf("abc"), 3);
    EXPECT_EQ(columnsOf("空港"), 4);
    EXPECT_EQ(columnsOf("e\xCC\x81"), 1) << "an accent of its own takes no column";
    EXPECT_EQ(cutToColumns("abcd", 3, "…"), "ab…");
    EXPECT_EQ(cutToColumns("abcd", 4, "…"), "abcd");
    EXPECT_EQ(cutToColumns("空港空港", 4, "…"), "空…");
    EXPECT_EQ(cutToColumns("abcde", 4, "..."), "a...");
}

TEST(Text, NamesThatLookAlikeComeFirst) {
    const std::tuple<const char*, const char*, std::size_t> distances[] = {
        {"", "", 0},         {"", "ab", 2},          {"ab", "", 2},           {"Gate", "gate", 0},
        {"café", "cafe", 1}, {"stauts", "stats", 1}, {"stauts", "status", 1}, {"sitting", "kitten", 3}};
    for (const auto& [a, b, distance] : distances)
        EXPECT_EQ(editDistance(a, b), distance) << a << " " << b;
    EXPECT_EQ(namesLike({"Hall", "Café", "Hell", "Hill", "Bar"}, "hell"),
              R"("Hell", "Hall", "Hill" and 2 more)");
}

TEST(Text, RowsAreAlignedByColumns) {
    const std::vector<std::string> lines =
        alignedLines({{"Name", "X"}, {"空港", "1"}, {"long name", ""}, {"a"}});
    EXPECT_EQ(lines, (std::vector<std::string>{"Name       X", "空港       1", "long name", "a"}));
    EXPECT_TRUE(alignedLines({}).empty());
    const std::vector<std::vector<std::string>> wide{{"X", "Name", "Realm"},
                                                     {"long", "空港空港", "hall.example"}};
    for (const auto& [columns, second] :
         std::vector<std::pair<int, std::string>>{{28, "long  空港空港  hall.example"},
                                                  {24, "long  空港空港  hall.ex…"},
                                                  {17, "long  空…   hal…"},
                                                  {1, "long  空…   hal…"}}) {
        auto rows = wide;
        fitToColumns(rows, {1, 2}, columns, "…");
        EXPECT_EQ(alignedLines(rows).back(), second) << columns;
    }
}

TEST(Text, LongLinesBreakAtBlanks) {
    using Lines = std::vector<std::string>;
    EXPECT_EQ(wrapped("  --a  one two", 99, 3), (Lines{"  --a  one two"}));
    EXPECT_EQ(wrapped("  --a  one two three", 10, 3), (Lines{"  --a  one", "   two", "   three"}));
    EXPECT_EQ(wrapped("空港 空港 toolongaword x", 9, 0), (Lines{"空港 空港", "toolongaword", "x"}));
    EXPECT_EQ(wrapped("", 9, 2), (Lines{""}));
}

}  // namespace
}  // namespace vexa::client
