#include "spectral/ChannelStatistics.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <cmath>

namespace vexa {
namespace {

SampleRecord record(int frequency, int congestion, int power, const std::vector<int>& bins) {
    std::array<std::byte, SampleRecord::kSize> bytes{};
    writeLittleEndian(bytes, 0, static_cast<std::uint16_t>(frequency));
    writeLittleEndian(bytes, 2, static_cast<std::uint16_t>(congestion));
    writeLittleEndian(bytes, 7, static_cast<std::int16_t>(power));
    for (std::size_t i = 0; i < SampleRecord::kBinCount; ++i)
        bytes[56 + i] = static_cast<std::byte>(bins[i % bins.size()]);
    return SampleRecord(bytes);
}

TEST(ChannelStatistics, FrequenciesBecomeChannels) {
    constexpr int kNone = -1;
    using Case = std::pair<int, int>;
    for (const auto& [frequency, channel] : {Case{0, kNone},
                                             {1, -481},
                                             {2402, kNone},
                                             {2403, 0},
                                             {2407, 0},
                                             {2412, 1},
                                             {2483, 15},
                                             {2484, 14},
                                             {2485, 14},
                                             {2512, 15},
                                             {2532, 16},
                                             {4899, 134},
                                             {4900, 180},
                                             {4920, 184},
                                             {5000, 200},
                                             {5001, 0},
                                             {5180, 36},
                                             {65535, 12107}})
        EXPECT_EQ(frequencyToChannel(frequency).value_or(kNone), channel) << frequency;
}

// Interference is the mean level of the bins above -120: with 56 equal ones -17.48 at a power of 96.
TEST(ChannelStatistics, ValuesOfOneChannel) {
    const std::vector<int> even = {100};
    const std::vector<int> none = {0};
    const std::vector<int> oneInEight = {255, 0, 0, 0, 0, 0, 0, 0};
    struct Case {
        const char* story;
        std::vector<SampleRecord> samples;
        int congestion;
        int noise;
    };
    const Case cases[] = {
        {"a mean is truncated", {record(2412, 30, 60, even), record(2412, 41, 60, even)}, 35, 67},
        {"a loud one is limited", {record(2412, 101, 96, even)}, 100, 100},
        {"one without magnitude", {record(2412, 50, 60, none)}, 50, 0},
        {"and spoils its channel", {record(2412, 50, 60, none), record(2412, 50, 60, even)}, 50, 0},
        {"a power beyond all", {record(2412, 50, 32767, even)}, 50, 0},
        {"a power below all", {record(2412, 0, -32768, even)}, 0, 0},
        {"no magnitude and no power: not a number", {record(2412, 1, -32768, none)}, 1, 0},
        {"7 bins at -8.45 and 49 at -56.58", {record(2412, 1, 96, oneInEight)}, 1, 70},
        {"7 bins at -84.45 and 49 at the floor", {record(2412, 1, 20, oneInEight)}, 1, 5},
        {"bins in pairs, 28 at -14.64 and 28 at -28.62", {record(2412, 1, 96, {5, 5, 1, 1})}, 1, 99},
    };
    for (const Case& c : cases) {
        const auto values = computeChannelValues(c.samples);
        ASSERT_EQ(values.size(), 1U) << c.story;
        EXPECT_EQ(values.at(1).congestion, c.congestion) << c.story;
        EXPECT_EQ(values.at(1).noise, c.noise) << c.story;
    }
}

// Ones among zeros, 1 or 10 of them, and all levels are whole but for the last bit, which decides the
// integer.
TEST(ChannelStatistics, ALevelNextToAWholeOneIsThatOfTheExactOrder) {
    int aboveWhole = 0;
    for (int power = -24; power < 96; ++power) {
        for (const std::size_t ones : {1U, 10U}) {
            std::vector<int> bins(SampleRecord::kBinCount, 0);
            std::fill_n(bins.begin(), ones, 1);
            const std::vector records(3, record(2412, 0, power, bins));
            const double mean =
                (sampleLevel(records[0]) + sampleLevel(records[1]) + sampleLevel(records[2])) / 3;
            aboveWhole += mean > std::round(mean) ? 1 : 0;
            const int noise = std::min(static_cast<int>(mean) + 120, 100);
            EXPECT_EQ(computeChannelValues(records).at(1).noise, noise) << power << ' ' << ones;
        }
    }
    EXPECT_GT(aboveWhole, 2);
}

TEST(ChannelStatistics, RecordsWithoutAChannelAreSkippedAndOthersSorted) {
    const auto values = computeChannelValues(std::vector{record(0, 9, 60, {1}), record(5180, 20, 60, {1}),
                                                         record(2402, 9, 60, {1}), record(2412, 10, 60, {1}),
                                                         record(5180, 40, 60, {1})});
    ASSERT_EQ(values.size(), 2U);
    EXPECT_EQ(values.at(1).congestion, 10);
    EXPECT_EQ(values.at(36).congestion, 30);
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
