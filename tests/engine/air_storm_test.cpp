#include <gtest/gtest.h>

#include "engine/StormSteps.h"
#include "engine/Story.h"

namespace vexa::test {
namespace {

constexpr int kSteps = 48;
constexpr std::uint64_t kFirstSeed = 1;
constexpr std::uint64_t kSeeds = 100;

void expectCalm(std::uint64_t seed) {
    const Ending ending =
        runStory(seed, Storm::scenario(1), [seed](World& world) { return storm(world, seed, kSteps); });
    EXPECT_TRUE(ending.isOrderly) << "seed " << seed << "\n" << ending.errors;
    EXPECT_EQ(ending.text, "") << "seed " << seed;
}

TEST(AirStorm, WhateverHappensTheListShownIsTheListLastReported) {
    for (std::uint64_t seed = kFirstSeed; seed < kFirstSeed + kSeeds; ++seed)
        expectCalm(seed);
}

}  // namespace
}  // namespace vexa::test
