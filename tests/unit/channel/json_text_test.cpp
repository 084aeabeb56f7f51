#include "channel/JsonText.h"

#include <gtest/gtest.h>

namespace vexa {
namespace {

TEST(JsonText, IsReadUpToItsFirstNul) {
    EXPECT_EQ(parseJsonText(std::string_view("{\"a\":1}\0{", 9))["a"], 1);
    EXPECT_TRUE(parseJsonText(std::string_view("\0{\"a\":1}", 8)).isNull());
}

TEST(JsonText, TakesCommentsAndAnyRoot) {
    EXPECT_EQ(parseJsonText("/* who */ {\"a\": 1 // what\n}")["a"], 1);
    EXPECT_EQ(parseJsonText("true"), Json::Value(true));
    EXPECT_EQ(parseJsonText("7"), Json::Value(7));
}

TEST(JsonText, BadTextGivesNullAndNeverThrows) {
    for (const std::string& text :
         {std::string(), std::string("nonsense"), std::string("{"), std::string("\xff\xfe"),
          std::string(100000, '['), std::string(5000, '{')})
        EXPECT_NO_THROW({ EXPECT_FALSE(parseJsonText(text).isString()); }) << text.substr(0, 20);
    EXPECT_TRUE(parseJsonText(std::string(100000, '[')).isNull());
}

TEST(JsonText, MembersReadAsTextByTheirType) {
    const Json::Value object =
        parseJsonText(R"({"text":"x","yes":true,"no":false,"null":null,"number":1,"array":[],"object":{}})");
    EXPECT_EQ(readText(object, "text"), "x");
    EXPECT_EQ(readText(object, "yes"), "true");
    EXPECT_EQ(readText(object, "no"), "false");
    EXPECT_EQ(readText(object, "null"), "");
    EXPECT_EQ(readText(object, "absent"), "");
    EXPECT_EQ(readText(Json::Value(), "absent"), "");
    for (const char* member : {"number", "array", "object"})
        EXPECT_EQ(readText(object, member), std::nullopt);
    for (const char* root : {"1", "true", "\"x\"", "[]"})
        EXPECT_EQ(readText(parseJsonText(root), "text"), std::nullopt) << root;
}

TEST(JsonText, LeavesInTheStyledForm) {
    EXPECT_EQ(toStyledText(Json::Value()), "null\n");
    EXPECT_EQ(toStyledText(Json::Value(true)), "true\n");
    Json::Value channels;
    channels[0]["Order"] = 2;
    channels[0]["Channel"] = 1;
    EXPECT_EQ(toStyledText(channels), "[\n   {\n      \"Channel\" : 1,\n      \"Order\" : 2\n   }\n]\n");
}

}  // namespace
}  // namespace vexa
