#include "channel/JsonText.h"

#include <gtest/gtest.h>

#if defined(__GNUC__)
#pragma GCC diagnostic ignored "-Wdeprecated-declarations"
#endif

#include <json/writer.h>

#include <string>
#include <vector>

#include "channel/Envelope.h"
#include "channel/StyledText.h"

namespace vexa {
namespace {

TEST(JsonText, AMemberThatIsTrueOrFalseReadsAsTheText) {
    const Json::Value object = parseJsonText(R"({"yes":true,"no":false})");
    EXPECT_EQ(readText(object, "yes"), "true");
    EXPECT_EQ(readText(object, "no"), "false");
}

TEST(StyledText, QuotedTwiceIsAStringWithinAString) {
    for (const char* text :
         {"", "a.example", "\"a\\b\"\n\t/", "\xC3\xA9 \xE2\x82\xAC \xF0\x9F\x98\x80", "\x01\xFF"}) {
        std::string once;
        appendQuoted(once, text);
        std::string twice = "before";
        appendQuoted(twice, once);
        std::string written = "before\"";
        appendQuotedTwice(written, text);
        EXPECT_EQ(written + '"', twice);
    }
}

TEST(StyledText, IsToTheByteWhatTheLibraryWrites) {
    std::vector<Json::Value> values;
    for (const char* text :
         {"null", "[]", "[[],{}]", "[-1,4294967295,2.5,true,null]", R"([[1],{"b":[],"a":{"c":2}}])",
          R"({"\u00e9":"\"\\\n\t\u0001\u007f/ \u20ac\ud83d\ude00"})"})
        values.push_back(parseJsonText(text));
    values.push_back(Json::Value("a\xC3\xFF\xF0\x9F"));
    for (std::size_t length = 1; length < 80; ++length) {
        values.emplace_back(Json::arrayValue).append(std::string(length, 'x'));
        values.emplace_back(Json::arrayValue).resize(static_cast<Json::ArrayIndex>(length));
    }
    for (const Json::Value& value : values) {
        EXPECT_EQ(toStyledText(value), Json::StyledWriter().write(value));
        Json::Value event;
        event["Source"] = "S";
        event["EventId"] = "I";
        event["Data"] = toStyledText(value);
        const std::string text = buildEnvelope("I", "S", toStyledText(value));
        event["Timestamp"] = parseJsonText(text)["Timestamp"];
        EXPECT_EQ(text, Json::StyledWriter().write(event));
    }
}

}  // namespace
}  // namespace vexa
