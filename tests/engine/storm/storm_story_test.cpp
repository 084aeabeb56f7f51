#include <gtest/gtest.h>

#include <map>

#include "engine/world/RunStory.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;

constexpr const char* kScenario = R"({
    "spectrum": {"channels": [1, 6, 36], "scanMs": 300, "levels": {
        "1": {"congestion": 20, "power": 50, "spread": 9},
        "6": {"congestion": 40, "power": 60, "spread": 9},
        "36": {"congestion": 60, "power": 70, "spread": 9}}}})";

// The adapter goes and comes back in the middle of scans, while clients ask and notifications pour in.
void turmoil(Story& story) {
    story.spectral().send("GET_CHANNEL_LIST");
    story.spectral().send("FULL_SCAN");
    for (int round = 0; round < 5; ++round) {
        story.play({passing(350ms), doing("pullAdapter")});
        story.hotspot().send("GET_IS_CARD_IN");
        story.play({doing("roam"), doing("radio", R"("software":"off")")});
        for (int code = 0; code < 16; ++code)
            story.act("notify", R"("source":16,"code":)" + std::to_string(code));
        story.play({doing("ihv", R"("dataHex":"005ec4060000000001000000325c0000ffff0102")"),
                    doing("insertAdapter"), doing("radio", R"("software":"on")")});
        story.spectral().send("GET_CURRENT_CHANNEL");
    }
    story.spectral().send("FULL_SCAN");
    story.advance(20s);
    story.spectral().send("STOP_SCAN");
    story.advance(1s);
}

// What does not depend on the order of threads: how often each event came, but for the samples, whose number
// depends on which scans the adapter's absence cut short; and that samples came for every channel.
std::string summary(Story& story) {
    std::map<std::string, int> counts;
    for (Client* client : {&story.spectral(), &story.hotspot()})
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
    const auto told = [](std::uint64_t seed) {
        const Ending ending = runStory({.seed = seed}, kScenario, [](Story& story) {
            turmoil(story);
            story.forget();
            story.tell(story.spectral().transcript() + story.hotspot().transcript() + story.log() +
                       story.debugLog());
        });
        EXPECT_EQ(ending.wrong, "");
        return ending.told;
    };
    for (const std::uint64_t seed : {42U, 43U}) {
        const std::string first = told(seed);
        EXPECT_GT(first.size(), 10000U);
        EXPECT_EQ(first, told(seed));
    }
}

TEST(Storm, AHundredSeedsGiveTheSameOutcome) {
    const Ending reference = runStory({.seed = 0}, kScenario, [](Story& story) {
        turmoil(story);
        story.tell(summary(story));
    });
    ASSERT_EQ(reference.wrong, "");
    EXPECT_NE(reference.told.find("SAMPLE_DATA_INTERFERENCE 3 1"), std::string::npos) << reference.told;
    EXPECT_STORY({.seed = 1, .seeds = 100}, kScenario, [&](Story& story) {
        turmoil(story);
        story.expect("summary", summary(story), reference.told);
    });
}

}  // namespace
}  // namespace vexa::test
