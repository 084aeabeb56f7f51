#include <gtest/gtest.h>

#include "engine/AirStory.h"
#include "engine/StoreStory.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;

TEST(RealmUpdate, AsksAtOnceWhileNothingIsConnected) {
    const Ending ending = runStory(
        11, air({network(1, "A", R"("anqp":"onQuery",)" + realms("a.example", "21"))}), [](World& world) {
            settle(world);
            world.perform(R"({"do":"clearCalls"})");
            world.hotspot().send("UPDATE_NETWORK_REALM");
            world.advance(0ms);
            std::string text = std::to_string(moduleRequests(world, 3)) + heard(world) + "\n";
            world.advance(200ms);
            return text + heard(world);
        });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "1\nGET_ALL_NETWORK_LIST A[a.example TTLS]");
}

TEST(RealmUpdate, DisconnectsFirstAndAsksWhenThatIsDone) {
    const Ending ending = runStory(
        22, air({network(1, "A", R"("anqp":"onQuery",)" + realms("a.example", "21"))}), [](World& world) {
            settle(world);
            world.perform(R"({"do":"osConnect","ssid":"A"})");
            world.advance(1s);
            world.hotspot().events();
            world.perform(R"({"do":"clearCalls"})");
            const std::size_t before = world.logSize();
            world.hotspot().send("UPDATE_NETWORK_REALM");
            world.advance(100ms);
            std::string text = heard(world) + "/" + std::to_string(moduleRequests(world, 3));
            world.advance(200ms);
            const std::string lines = messagesSince(world, before);
            return text + "/" + heard(world) + "/" + count(lines, "Manually disconnect from a HS20 network.");
        });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "/1/GET_ALL_NETWORK_LIST A[a.example TTLS]/1 ");
}

TEST(RealmUpdate, KnowsAConnectionToANetworkThatIsNotListed) {
    const Ending ending =
        runStory(23, air({network(1, "A"), network(2, "Legacy", R"("reported":false)")}), [](World& world) {
            settle(world);
            world.perform(R"({"do":"osConnect","ssid":"Legacy"})");
            world.advance(1s);
            const std::size_t before = world.logSize();
            world.hotspot().send("UPDATE_NETWORK_REALM");
            world.advance(0ms);
            return count(messagesSince(world, before), "Manually disconnect from a non-HS20 network.");
        });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "1 ");
}

TEST(RealmUpdate, DoesNothingWithoutAnAdapter) {
    const Ending ending = runStory(12, air({network(1, "A")}), [](World& world) {
        settle(world);
        world.perform(R"({"do":"pullAdapter"})");
        world.perform(R"({"do":"clearCalls"})");
        const std::size_t before = world.logSize();
        world.hotspot().send("UPDATE_NETWORK_REALM");
        world.advance(0ms);
        return messagesSince(world, before) + std::to_string(world.perform(R"({"query":"calls"})").size());
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "UI requested to update HS20 network realm.\n0");
}

}  // namespace
}  // namespace vexa::test
