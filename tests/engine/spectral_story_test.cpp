#include <gtest/gtest.h>

#include "engine/Story.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;

constexpr const char* kThreeChannels = R"({
    "spectrum": {"channels": [36, 1, 36, 6], "scanMs": 400, "levels": {
        "1": {"congestion": 30, "power": 60, "spread": 0},
        "36": {"congestion": 70, "power": 96, "spread": 0}}}})";

std::string sample(const ClientEvent& event) {
    std::string text = event.id.substr(event.id.rfind('_') + 1);
    for (const std::string& member : event.data.getMemberNames())
        text += " " + member + "=" + event.data[member].asString();
    return text + "\n";
}

std::string samplesOf(Client& client) {
    std::string text;
    for (const ClientEvent& event : client.events())
        text += sample(event);
    return text;
}

TEST(Spectrum, NothingIsPublishedBeforeTheChannelListWasAskedFor) {
    const Ending ending = runStory(11, kThreeChannels, [](World& world) {
        world.spectral().send("FULL_SCAN");
        world.advance(5s);
        std::string text = world.spectral().ids() + "|";
        world.spectral().send("GET_CHANNEL_LIST");
        world.advance(0ms);
        const auto list = world.spectral().events();
        text += list.at(0).id + " " + list.at(1).dataText + "|";
        world.advance(1s);
        return text + samplesOf(world.spectral());
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text,
              "|RADIO_ON [\n   {\n      \"Channel\" : 1,\n      \"Order\" : 2\n   },\n   {\n      "
              "\"Channel\" : 6,\n      "
              "\"Order\" : 3\n   },\n   {\n      \"Channel\" : 36,\n      \"Order\" : 1\n   }\n]\n|"
              "CONGESTION congestion_value=70 order=1\n"
              "INTERFERENCE noise_value=100 order=1\n"
              "CONGESTION congestion_value=30 order=2\n"
              "INTERFERENCE noise_value=67 order=2\n");
}

TEST(Spectrum, ValuesAreSmoothedAndSentOnChangeAlone) {
    const Ending ending = runStory(12, kThreeChannels, [](World& world) {
        world.spectral().send("GET_CHANNEL_LIST");
        world.spectral().send("FULL_SCAN");
        world.advance(4s);
        world.spectral().ids();
        std::string text;
        world.perform(R"({"do":"levels","levels":{"1":{"congestion":0,"power":-32000,"spread":0}}})");
        for (int scan = 0; scan < 6; ++scan) {
            world.advance(400ms);
            text += samplesOf(world.spectral());
        }
        world.perform(R"({"do":"levels","levels":{"1":{"congestion":80,"power":60,"spread":0}}})");
        world.advance(400ms);
        return text + samplesOf(world.spectral());
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text,
              "CONGESTION congestion_value=12 order=2\n"
              "CONGESTION congestion_value=4 order=2\n"
              "CONGESTION congestion_value=1 order=2\n"
              "CONGESTION congestion_value=0 order=2\n"
              "CONGESTION congestion_value=80 order=2\n");
}

// Requests to the module, with their times since the beginning of the story.
std::string requestsSince(World& world, double start) {
    std::string text;
    for (const Json::Value& call : world.perform(R"({"query":"calls"})")) {
        if (call["inHex"].asString().size() != 64) continue;  // the hotspot module's
        text += std::to_string(static_cast<int>(call["atMs"].asDouble() - start)) + ":" +
                (call["inHex"].asString().substr(48, 2) == "01" ? "start" : "stop") + "=" +
                call["result"].asString() + " ";
    }
    return text;
}

double timeOf(World& world) {
    return world.perform(R"({"query":"time"})")["ms"].asDouble();
}

TEST(Spectrum, TheWatchdogStartsAScanAnewWhenNoneCompletes) {
    const Ending ending = runStory(
        13, R"({"spectrum": {"channels": [1], "completes": false, "scanMs": 400}})", [](World& world) {
            const double start = timeOf(world);
            world.spectral().send("FULL_SCAN");
            world.advance(25s);
            world.spectral().send("STOP_SCAN");
            world.spectral().send("STOP_SCAN");
            world.advance(25s);
            return requestsSince(world, start);
        });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "0:start=0 9999:start=0 19999:start=0 25000:stop=0 ") << ending.errors;
}

TEST(Spectrum, CompletionsKeepTheWatchdogFromFiringAndRestartTheScan) {
    const Ending ending =
        runStory(14, R"({"spectrum": {"channels": [1], "scanMs": 9000}})", [](World& world) {
            const double start = timeOf(world);
            world.spectral().send("FULL_SCAN");
            world.advance(30s);
            std::string text = requestsSince(world, start) + "|";
            return text +
                   (world.debugLog().find("ScanTimerRoutine") == std::string::npos ? "quiet" : "fired");
        });
    EXPECT_EQ(ending.text, "0:start=0 9000:start=0 18000:start=0 27000:start=0 |quiet") << ending.errors;
}

TEST(Spectrum, AFailedStartIsTriedAgainAndTheStopIsSentAllTheSame) {
    const Ending ending = runStory(
        15, R"({"spectrum": {"channels": [1], "scanMs": 400, "completes": false}})", [](World& world) {
            world.perform(R"({"do":"fail","call":"WlanIhvControl","match":"scan","error":31,"times":2})");
            const double start = timeOf(world);
            world.spectral().send("STOP_SCAN");
            world.spectral().send("FULL_SCAN");
            world.advance(21s);
            world.spectral().send("STOP_SCAN");
            world.advance(0ms);
            return requestsSince(world, start);
        });
    EXPECT_EQ(ending.text, "0:start=31 9999:start=31 19999:start=0 21000:stop=0 ") << ending.errors;
}

TEST(Spectrum, TheChannelListKeepsWhatWasKnownWhenItCanNotBeRead) {
    const Ending ending = runStory(16, kThreeChannels, [](World& world) {
        std::string text;
        const auto ask = [&] {
            world.spectral().send("GET_CHANNEL_LIST");
            world.advance(0ms);
            for (const ClientEvent& event : world.spectral().events())
                text += event.id.substr(0, 10) + "=" + std::to_string(event.data.size()) + " ";
        };
        world.perform(R"({"do":"fail","call":"WlanIhvControl","match":"channelList","error":5})");
        ask();
        ask();
        world.perform(R"({"do":"fail","call":"WlanIhvControl","match":"channelList","error":5})");
        ask();
        world.perform(R"({"do":"pullAdapter"})");
        world.spectral().ids();
        ask();
        return text;
    });
    EXPECT_EQ(
        ending.text,
        "RADIO_ON=0 SPECTRAL_A=0 RADIO_ON=0 SPECTRAL_A=3 RADIO_ON=0 SPECTRAL_A=3 RADIO_OFF=0 SPECTRAL_A=3 ")
        << ending.errors;
}

}  // namespace
}  // namespace vexa::test
