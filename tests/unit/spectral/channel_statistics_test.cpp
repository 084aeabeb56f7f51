#include "spectral/ChannelStatistics.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <cmath>

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

// Ones among zeros, 1 or 10 of them, and all levels are whole but for the last bit, which decides the
// integer.
TEST(ChannelStatistics, ALevelNextToAWholeOneIsThatOfTheExactOrder) {
    int aboveWhole = 0;
    for (int power = -24; power < 96; ++power) {
        for (const std::size_t ones : {1U, 10U}) {
            std::array<std::byte, SampleRecord::kSize> bytes{};
            writeLittleEndian(bytes, 0, std::uint16_t{2412});
            writeLittleEndian(bytes, 7, static_cast<std::int16_t>(power));
            std::fill_n(bytes.begin() + 56, ones, std::byte{1});
            const std::vector records(3, SampleRecord(bytes));
            const double level = sampleLevel(records[0]);
            const double mean = (level + level + level) / 3;
            aboveWhole += mean > std::round(mean) ? 1 : 0;
            const int noise = std::min(static_cast<int>(mean) + 120, 100);
            EXPECT_EQ(computeChannelValues(records).at(1).noise, noise) << power << ' ' << ones;
        }
    }
    EXPECT_GT(aboveWhole, 2);
}

TEST(ChannelStatistics, CongestionIsSmoothedUnlessNothingWasPublished) {
    const std::tuple<int, int, int> cases[] = {{0, 50, 50}, {50, 20, 32},  {50, 0, 20},
                                               {1, 0, 0},   {100, 99, 99}, {0, 0, 0}};
    for (const auto& [published, computed, next] : cases)
        EXPECT_EQ(smoothCongestion(published, computed), next);
    for (int value = 0; value <= 100; ++value)
        EXPECT_EQ(smoothCongestion(value, value), value);
}

}  // namespace
}  // namespace vexa
