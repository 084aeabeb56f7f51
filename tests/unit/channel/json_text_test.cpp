#include "channel/JsonText.h"

#include <gtest/gtest.h>

namespace vexa {
namespace {

TEST(JsonText, AMemberThatIsTrueOrFalseReadsAsTheText) {
    const Json::Value object = parseJsonText(R"({"yes":true,"no":false})");
    EXPECT_EQ(readText(object, "yes"), "true");
    EXPECT_EQ(readText(object, "no"), "false");
}

}  // namespace
}  // namespace vexa
