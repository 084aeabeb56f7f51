// Compares our JSON texts with those of JsonCpp's styled writer, over as many random values and events as
// told: `json_proof COUNT [SEED]`; exit code 1 if any differ.

#if defined(__GNUC__)
#pragma GCC diagnostic ignored "-Wdeprecated-declarations"
#endif

#include <json/writer.h>

#include <cstdio>
#include <cstdlib>
#include <random>
#include <string>
#include <vector>

#include "channel/Envelope.h"
#include "channel/JsonText.h"
#include "channel/StyledText.h"

namespace {

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

bool isSameText(const Json::Value& value) {
    return vexa::toStyledText(value) == Json::StyledWriter().write(value);
}

bool isSameEvent(const std::string& id, const std::string& data, bool hasData) {
    Json::Value event;
    event["Source"] = "S";
    event["EventId"] = id;
    if (hasData) event["Data"] = data;
    const std::string text = hasData ? vexa::buildEnvelope(id, "S", data) : vexa::buildEnvelope(id, "S");
    event["Timestamp"] = vexa::parseJsonText(text)["Timestamp"];
    return text == Json::StyledWriter().write(event);
}

}  // namespace

int main(int argc, char** argv) {
    const long count = argc > 1 ? std::atol(argv[1]) : 100'000;
    Random random(argc > 2 ? static_cast<unsigned>(std::atol(argv[2])) : 1);
    long different = 0;
    for (long i = 0; i < count; ++i) {
        const Json::Value value = randomValue(random, 0);
        const std::string data = i % 2 == 0 ? randomText(random) : vexa::toStyledText(value);
        if (!isSameText(value) || !isSameEvent(randomText(random), data, i % 3 != 0)) ++different;
    }
    std::printf("%ld values and events, %ld different\n", count, different);
    return different == 0 ? 0 : 1;
}
