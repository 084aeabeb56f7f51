#include "spectral/ChannelStatistics.h"

#include <gtest/gtest.h>

namespace vexa {
namespace {

TEST(ChannelStatistics, FrequenciesBecomeChannels) {
    constexpr int kNone = -2;
    const std::pair<int, int> cases[] = {{0, kNone}, {1, -481},   {2402, kNone}, {2403, 0},   {2407, 0},
                                         {2412, 1},  {2483, 15},  {2484, 14},    {2485, 14},  {2512, 15},
                                         {2532, 16}, {4899, 134}, {4900, 180},   {4920, 184}, {5000, 200},
                                         {5001, 0},  {5180, 36},  {65535, 12107}};
    for (const auto& [frequency, channel] : cases)
        EXPECT_EQ(frequencyToChannel(frequency).value_or(kNone), channel) << frequency;
}

TEST(ChannelStatistics, CongestionIsSmoothedUnlessNothingWasPublished) {
    struct Case {
        int published;
        int computed;
        int next;
    };
    for (const Case& c : {Case{0, 50, 50}, {50, 20, 32}, {50, 0, 20}, {1, 0, 0}, {100, 99, 99}, {0, 0, 0}})
        EXPECT_EQ(smoothCongestion(c.published, c.computed), c.next);
    for (int value = 0; value <= 100; ++value)
        EXPECT_EQ(smoothCongestion(value, value), value);
}

}  // namespace
}  // namespace vexa
