#include <gtest/gtest.h>

#include "engine/AirStory.h"
#include "engine/StoreStory.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;

constexpr const char* kEnds = "The NetworkingMgr thread is to be terminated...";

std::string fetched(int number, const std::string& ssid) {
    return network(number, ssid, realms("a.example", "21"));
}

// A stored credential that fits no network here.
void addCredential(World& world) {
    world.hotspot().send("ADD_CREDENTIAL", ttlsData("elsewhere.example"));
    world.advance(0ms);
}

TEST(ConnectingThread, EndsWhereverItIsWhenTheAdapterGoes) {
    struct Case {
        const char* what;
        const char* members;
        std::vector<std::string> before;
        int pauseMs;
    };
    const Case cases[] = {
        {"waiting", "", {}, 0},
        {"waiting in the middle", "", {}, 4000},
        {"asleep after the radio", "", {R"({"do":"radio","software":"off"})"}, 3000},
        {"asleep after the radio for no time yet", "", {R"({"do":"radio","software":"off"})"}, 0},
        {"asleep at the session gate", R"("session":"disconnected")", {R"({"do":"reportNetworks"})"}, 2000},
    };
    for (const Case& c : cases)
        for (std::uint64_t seed = 200; seed < 220; ++seed) {
            const Ending ending = runStory(seed, air({fetched(1, "A")}, c.members), [&](World& world) {
                addCredential(world);
                settle(world);
                const int handles = world.perform(R"({"query":"handles"})").asInt();
                for (const std::string& action : c.before)
                    world.perform(action);
                world.advance(std::chrono::milliseconds(c.pauseMs));
                const std::size_t before = world.logSize();
                world.perform(R"({"do":"pullAdapter"})");
                world.advance(30s);
                world.perform(R"({"do":"insertAdapter"})");
                world.perform(R"({"do":"radio","software":"on"})");
                world.advance(30s);
                world.perform(R"({"do":"pullAdapter"})");
                const std::string lines = messagesSince(world, before);
                return count(lines, kEnds) + count(lines, "Deinitialize supplicant completed.") +
                       std::to_string(handles - world.perform(R"({"query":"handles"})").asInt());
            });
            EXPECT_TRUE(ending.isOrderly) << c.what << " seed " << seed << ending.errors;
            EXPECT_EQ(ending.text, "2 2 1") << c.what << " seed " << seed;
        }
}

// The seed decides whether the sleep or the wait for its end is over first, at the same moment.
TEST(ConnectingThread, OneThatIsLateLeavesItsLineAndEndsByItself) {
    int late = 0;
    for (std::uint64_t seed = 300; seed < 360; ++seed) {
        const Ending ending = runStory(seed, air({fetched(1, "A")}), [](World& world) {
            addCredential(world);
            settle(world);
            const std::size_t before = world.logSize();
            world.perform(R"({"do":"radio","software":"off"})");
            world.perform(R"({"do":"pullAdapter"})");
            world.perform(R"({"do":"insertAdapter"})");
            world.advance(60s);
            const std::string lines = messagesSince(world, before);
            return count(lines, "Time out when waiting for network connecting thread termination.") +
                   count(lines, kEnds);
        });
        EXPECT_TRUE(ending.isOrderly) << "seed " << seed << ending.errors;
        EXPECT_TRUE(ending.text.ends_with(" 1 ")) << "seed " << seed << " " << ending.text;
        if (ending.text.starts_with("1")) ++late;
    }
    EXPECT_GT(late, 0) << "no seed was late";
}

TEST(ConnectingThread, AServiceThatStopsWhileItSleepsStopsInOrder) {
    for (std::uint64_t seed = 400; seed < 420; ++seed) {
        const Ending ending = runStory(seed, air({fetched(1, "A")}), [](World& world) {
            settle(world);
            world.perform(R"({"do":"radio","software":"off"})");
            return std::string();
        });
        EXPECT_TRUE(ending.isOrderly) << "seed " << seed << ending.errors;
    }
}

}  // namespace
}  // namespace vexa::test
