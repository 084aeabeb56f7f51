#include <gtest/gtest.h>

#include <cstdlib>

#include "engine/StormSteps.h"
#include "engine/Story.h"
#include "engine/connect_calm.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;

constexpr int kSteps = 48;

std::uint64_t wished(const char* variable, std::uint64_t usual) {
    const char* const text = std::getenv(variable);
    return text == nullptr ? usual : std::strtoull(text, nullptr, 10);
}

// Any number of seeds, by hand: VEXA_STORM_SEEDS, VEXA_STORM_FIRST.
TEST(ConnectStorm, LeftAloneWithANetworkThatLetsItInTheEngineIsConnectedWithinAMinute) {
    const std::uint64_t first = wished("VEXA_STORM_FIRST", 1);
    const std::uint64_t count = wished("VEXA_STORM_SEEDS", 12);
    for (std::uint64_t seed = first; seed < first + count; ++seed) {
        const Ending ending = runStory(seed, Storm::scenario(1), [&](World& world) {
            return stormOfConnections(world, seed, kSteps, 60s);
        });
        EXPECT_TRUE(ending.isOrderly) << "seed " << seed << "\n" << ending.errors;
        EXPECT_EQ(ending.text, "") << "seed " << seed;
    }
}

}  // namespace
}  // namespace vexa::test
