#include <gtest/gtest.h>

#include <algorithm>
#include <map>
#include <random>

#include "engine/Story.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;

constexpr const char* kScenario = R"({
    "spectrum": {"channels": [1, 6, 36], "scanMs": 300, "levels": {
        "1": {"congestion": 20, "power": 50, "spread": 9},
        "6": {"congestion": 40, "power": 60, "spread": 9},
        "36": {"congestion": 60, "power": 70, "spread": 9}}}})";

// The adapter goes and comes back in the middle of scans, while clients ask and notifications pour in.
std::string turmoil(World& world) {
    world.spectral().send("GET_CHANNEL_LIST");
    world.spectral().send("FULL_SCAN");
    for (int round = 0; round < 5; ++round) {
        world.advance(350ms);
        world.perform(R"({"do":"pullAdapter"})");
        world.hotspot().send("GET_IS_CARD_IN");
        world.perform(R"({"do":"roam"})");
        world.perform(R"({"do":"radio","software":"off"})");
        for (int code = 0; code < 16; ++code)
            world.perform(R"({"do":"notify","source":16,"code":)" + std::to_string(code) + "}");
        world.perform(R"({"do":"ihv","dataHex":"005ec4060000000001000000325c0000ffff0102"})");
        world.perform(R"({"do":"insertAdapter"})");
        world.perform(R"({"do":"radio","software":"on"})");
        world.spectral().send("GET_CURRENT_CHANNEL");
    }
    world.spectral().send("FULL_SCAN");
    world.advance(20s);
    world.spectral().send("STOP_SCAN");
    world.advance(1s);
    return {};
}

// What does not depend on the order of threads: how often each event came, but for the samples, whose number
// depends on which scans the adapter's absence cut short; and that samples came for every channel.
std::string summary(World& world) {
    std::map<std::string, int> counts;
    for (Client* client : {&world.spectral(), &world.hotspot()})
        for (const ClientEvent& event : client->events()) {
            if (event.id.find("SAMPLE_DATA") == std::string::npos)
                ++counts[event.source + " " + event.id];
            else
                counts[event.id + " " + event.data["order"].asString()] = 1;
        }
    std::string text;
    for (const auto& [name, count] : counts)
        text += name + " " + std::to_string(count) + "\n";
    return text;
}

TEST(Storm, TheSameSeedGivesTheSameMessagesAndTheSameLogByteForByte) {
    const auto story = [](World& world) {
        turmoil(world);
        world.spectral().events();
        world.hotspot().events();
        return world.spectral().transcript() + world.hotspot().transcript() + world.log() + world.debugLog();
    };
    const Ending first = runStory(42, kScenario, story);
    const Ending second = runStory(42, kScenario, story);
    EXPECT_TRUE(first.isOrderly) << first.errors;
    EXPECT_GT(first.text.size(), 10000U);
    EXPECT_EQ(first.text, second.text);
}

TEST(Storm, AHundredSeedsGiveTheSameOutcome) {
    const auto story = [](World& world) {
        turmoil(world);
        return summary(world);
    };
    const Ending reference = runStory(0, kScenario, story);
    ASSERT_TRUE(reference.isOrderly) << reference.errors;
    EXPECT_NE(reference.text.find("SAMPLE_DATA_INTERFERENCE 3 1"), std::string::npos) << reference.text;
    for (std::uint64_t seed = 1; seed <= 100; ++seed) {
        const Ending ending = runStory(seed, kScenario, story);
        ASSERT_TRUE(ending.isOrderly) << "seed " << seed << "\n" << ending.errors;
        ASSERT_EQ(ending.text, reference.text) << "seed " << seed;
    }
}

std::string randomHex(std::mt19937_64& random) {
    static const char* const beginnings[] = {"", "005ec406", "005ec403", "005ec4060000000001000000325c0000",
                                             "005ec4060000000002000000325c0000"};
    std::string hex = beginnings[random() % 5];
    for (std::uint64_t left = random() % 600; left > 0; --left) {
        hex += "0123456789abcdef"[random() % 16];
        hex += "0123456789abcdef"[random() % 16];
    }
    return hex;
}

std::string randomAction(std::mt19937_64& random) {
    static const char* const actions[] = {
        R"({"do":"pullAdapter"})",
        R"({"do":"insertAdapter"})",
        R"({"do":"radio","software":"off"})",
        R"({"do":"radio","software":"on","hardware":"on"})",
        R"({"do":"roam"})",
        R"({"do":"fail","call":"WlanIhvControl","error":31,"times":3})",
        R"({"do":"fail","call":"WlanQueryInterface","error":6,"times":2})",
        R"({"do":"fail","call":"WlanEnumInterfaces","error":8})",
        R"({"do":"fail","call":"WlanOpenHandle","error":8})",
        R"({"do":"reply","match":"channelList","dataHex":"00"})",
    };
    constexpr std::size_t kFixed = std::size(actions);
    const std::size_t choice = random() % (kFixed + 2);
    if (choice < kFixed) return actions[choice];
    if (choice == kFixed) return R"({"do":"ihv","dataHex":")" + randomHex(random) + "\"}";
    return R"({"do":"notify","source":)" + std::to_string(8 << random() % 4) + R"(,"code":)" +
           std::to_string(random() % 24) + R"(,"dataHex":")" + randomHex(random) + "\"}";
}

TEST(Storm, WhateverComesTheServiceAnswersAndStopsInOrder) {
    static const char* const spectral[] = {"FULL_SCAN", "STOP_SCAN", "GET_CHANNEL_LIST",
                                           "GET_CURRENT_CHANNEL", "NONSENSE"};
    static const char* const hotspot[] = {"GET_RADIO", "GET_IS_CARD_IN", "NONSENSE"};
    for (std::uint64_t seed = 1000; seed < 1100; ++seed) {
        const Ending ending = runStory(seed, kScenario, [seed](World& world) {
            std::mt19937_64 random(seed);
            for (int step = 0; step < 40; ++step) {
                world.perform(randomAction(random));
                world.spectral().send(spectral[random() % std::size(spectral)]);
                world.hotspot().send(hotspot[random() % std::size(hotspot)]);
                if (random() % 3 == 0) world.advance(std::chrono::milliseconds(random() % 4000));
            }
            world.advance(0ms);
            world.hotspot().ids();
            world.hotspot().send("GET_IS_CARD_IN");
            world.advance(0ms);
            return world.hotspot().ids().substr(0, 9);
        });
        ASSERT_TRUE(ending.isOrderly) << "seed " << seed << "\n" << ending.errors;
        ASSERT_EQ(ending.text, "CARD_PLUG") << "seed " << seed;
    }
}

}  // namespace
}  // namespace vexa::test
