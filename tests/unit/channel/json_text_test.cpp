#include "channel/JsonText.h"

#include <gtest/gtest.h>

#if defined(__GNUC__)
#pragma GCC diagnostic ignored "-Wdeprecated-declarations"
#endif

#include <json/writer.h>

#include <random>

#include "channel/Envelope.h"
#include "channel/StyledText.h"

namespace vexa {
namespace {

TEST(JsonText, AMemberThatIsTrueOrFalseReadsAsTheText) {
    const Json::Value object = parseJsonText(R"({"yes":true,"no":false})");
    EXPECT_EQ(readText(object, "yes"), "true");
    EXPECT_EQ(readText(object, "no"), "false");
}

using Random = std::mt19937;

std::string randomText(Random& random) {
    static const std::vector<std::string> kPieces = {
        "a",    "Lorem ipsum", "\"",          "\\",       "\n",     "\t",
        "/",    "\x7F",        "\x01",        "\u00E9",   "\u20AC", "\U0001F600",
        "\xC3", "\xFF",        "{\n   \"a\"", "\xF0\x9F", " ",      std::string(1, '\0')};
    std::string text;
    for (auto pieces = random() % 5; pieces > 0; --pieces)
        text += kPieces[random() % (random() % 2 == 0 ? 2 : kPieces.size())];
    return text;
}

Json::Value randomValue(Random& random, int depth) {
    Json::Value value;
    switch (random() % (depth > 3 ? 6 : 8)) {
        case 0:
            return value;
        case 1:
            return random() % 2 == 0;
        case 2:
            return static_cast<int>(random());
        case 3:
            return random();
        case 4:
            return static_cast<int>(random()) / 1e4;
        case 5:
            return randomText(random);
        case 6:
            value = Json::Value(Json::arrayValue);
            for (auto size = random() % (random() % 8 == 0 ? 30 : 6); size > 0; --size)
                value.append(randomValue(random, depth + 1));
            return value;
        default:
            value = Json::Value(Json::objectValue);
            for (auto size = random() % 6; size > 0; --size)
                value[(random() % 2 == 0 ? "Name" : "\u00E9") + std::to_string(random() % 100)] =
                    randomValue(random, depth + 1);
            return value;
    }
}

TEST(StyledText, IsToTheByteWhatTheLibraryWrites) {
    Random random(1);
    for (int i = 0; i < 3000; ++i) {
        const Json::Value value = randomValue(random, 0);
        ASSERT_EQ(toStyledText(value), Json::StyledWriter().write(value));
    }
}

TEST(Envelope, IsToTheByteWhatTheLibraryWrites) {
    Random random(1);
    for (int i = 0; i < 300; ++i) {
        const std::string data = i % 2 == 0 ? randomText(random) : toStyledText(randomValue(random, 0));
        const std::string id = randomText(random);
        Json::Value event;
        event["Source"] = "S";
        event["EventId"] = id;
        if (i % 3 != 0) event["Data"] = data;
        const std::string text = i % 3 != 0 ? buildEnvelope(id, "S", data) : buildEnvelope(id, "S");
        event["Timestamp"] = parseJsonText(text)["Timestamp"];
        ASSERT_EQ(text, Json::StyledWriter().write(event));
    }
}

}  // namespace
}  // namespace vexa
