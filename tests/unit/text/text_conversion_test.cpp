#include "text/TextConversion.h"

#include <gtest/gtest.h>

namespace vexa {
namespace {

TEST(TextConversion, WidthChangesUnitByUnit) {
    EXPECT_EQ(narrowFromWide(L"a\u00e9\u0141"), "a\xe9\x41");
    EXPECT_EQ(wideFromNarrow(std::string_view("\0\xc3\xa9", 3)), std::wstring(L"\0\u00c3\u00a9", 3));
}

TEST(TextConversion, TheLocalesNarrowingEndsAtTheFirstUnitThatHasNoByte) {
    EXPECT_EQ(narrowByLocale(L"caf\u00e9").text, "caf\xe9");
    EXPECT_TRUE(narrowByLocale(L"caf\u00e9").isComplete);
    EXPECT_EQ(narrowByLocale(L"z\u0142oty").text, "z");
    EXPECT_FALSE(narrowByLocale(L"z\u0142oty").isComplete);
}

TEST(TextConversion, ALeadingIntegerIsReadAsFarAsItGoes) {
    const std::pair<const wchar_t*, std::int32_t> cases[] = {{L" \t8002 rest", 8002},
                                                             {L"+7", 7},
                                                             {L"-5x", -5},
                                                             {L"", 0},
                                                             {L"- 5", 0},
                                                             {L"\u00bd", 0},
                                                             {L"0x10", 0},
                                                             {L"2147483647", 2147483647},
                                                             {L"2147483648", 2147483647},
                                                             {L"-2147483648", -2147483647 - 1},
                                                             {L"-99999999999999999999", -2147483647 - 1}};
    for (const auto& [text, value] : cases)
        EXPECT_EQ(leadingInteger(text), value) << narrowFromWide(text);
}

TEST(TextConversion, ComparisonWithoutCaseIsThreeWay) {
    EXPECT_EQ(compareNoCase("PCI\\Ven_1F5D", "pci\\ven_1f5d"), 0);
    EXPECT_LT(compareNoCase("pci", "PCI\\"), 0);
    EXPECT_GT(compareNoCase("b", "A"), 0);
    EXPECT_LT(compareNoCase("_", "a"), 0);
    EXPECT_EQ(compareNoCase(L"TRUE", L"true"), 0);
    EXPECT_NE(compareNoCase("\xc9", "\xe9"), 0);
}

}  // namespace
}  // namespace vexa
