#include "channel/JsonText.h"

#include <gtest/gtest.h>

namespace vexa {
namespace {

TEST(JsonText, AMemberThatIsTrueOrFalseReadsAsTheText) {
    const Json::Value object = parseJsonText(R"({"yes":true,"no":false})");
    EXPECT_EQ(readText(object, "yes"), "true");
    EXPECT_EQ(readText(object, "no"), "false");
}

TEST(JsonText, QuotesAsTheStyledWriterDoesAndGivesEachByteThatIsNoTextItsMark) {
    std::string all;
    for (char c = 1; c < 0x7F; ++c)
        all += c;
    const std::string texts[] = {"", all + "\x7F", "d\u00E9j\u00E0 \u20AC \uFFFD", "\U0001F600\U0010FFFF",
                                 std::string("a\0b", 3)};
    for (const std::string& text : texts) {
        std::string quoted;
        appendQuoted(quoted, text);
        EXPECT_EQ(quoted + "\n", toStyledText(Json::Value(text)));
    }
    std::string quoted;
    appendQuoted(quoted, "\xE9t\xE9\xC3");
    EXPECT_EQ(quoted, R"("\ufffdt\ufffd\ufffd")");
}

}  // namespace
}  // namespace vexa
