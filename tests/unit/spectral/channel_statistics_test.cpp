#include "spectral/ChannelStatistics.h"

#include <gtest/gtest.h>

#include <array>
#include <cmath>
#include <random>

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
    struct Case {
        int frequency;
        int channel;
    };
    constexpr int kNone = -1;
    for (const Case& c : {Case{0, kNone}, {1, -481},  {2402, kNone}, {2403, 0},     {2406, 0},   {2407, 0},
                          {2412, 1},      {2472, 13}, {2483, 15},    {2484, 14},    {2485, 14},  {2492, 14},
                          {2512, 15},     {2532, 16}, {4899, 134},   {4900, 180},   {4920, 184}, {5000, 200},
                          {5001, 0},      {5180, 36}, {5825, 165},   {65535, 12107}})
        EXPECT_EQ(frequencyToChannel(c.frequency).value_or(kNone), c.channel) << c.frequency;
}

TEST(ChannelStatistics, OrdersAreDenseAndARepeatKeepsItsFirst) {
    EXPECT_EQ(orderChannels(std::vector{36, 1, 36, 6, 1, 40}),
              (ChannelOrder{{36, 1}, {1, 2}, {6, 3}, {40, 4}}));
    EXPECT_TRUE(orderChannels({}).empty());
}

TEST(ChannelStatistics, ValuesOfOneChannel) {
    const std::vector<int> even = {100};
    const std::vector<int> none = {0};
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
        {"one bin in eight", {record(2412, 1, 96, {255, 0, 0, 0, 0, 0, 0, 0})}, 1, 70},
    };
    for (const Case& c : cases) {
        const auto values = computeChannelValues(c.samples);
        ASSERT_EQ(values.size(), 1U) << c.story;
        EXPECT_EQ(values.at(1).congestion, c.congestion) << c.story;
        EXPECT_EQ(values.at(1).noise, c.noise) << c.story;
    }
}

TEST(ChannelStatistics, RecordsWithoutAChannelAreSkippedAndOthersSorted) {
    const std::vector<SampleRecord> samples = {record(0, 9, 60, {1}), record(5180, 20, 60, {1}),
                                               record(2402, 9, 60, {1}), record(2412, 10, 60, {1}),
                                               record(5180, 40, 60, {1})};
    const auto values = computeChannelValues(samples);
    ASSERT_EQ(values.size(), 2U);
    EXPECT_EQ(values.at(1).congestion, 10);
    EXPECT_EQ(values.at(36).congestion, 30);
    EXPECT_TRUE(computeChannelValues({}).empty());
}

// Bin by bin and without a shortcut.
double plainLevel(const SampleRecord& sample) {
    double squares = 0.0;
    for (const std::byte bin : sample.bins())
        squares += std::pow(static_cast<double>(std::to_integer<int>(bin)), 2.0);
    const double exponent = (sample.power() - 96) / 10.0;
    const double factor = exponent < 0 ? 1.0 / std::pow(10.0, std::fabs(exponent)) : std::pow(10.0, exponent);
    double sum = 0.0;
    for (const std::byte bin : sample.bins()) {
        double d = static_cast<double>(std::to_integer<int>(bin));
        if (d == 0.0) d = 1.0;
        double v = 10.0 * std::log10((d * d / squares) * factor);
        if (v < -120.0) v = -120.0;
        sum += v;
    }
    return sum / 56.0;
}

TEST(ChannelStatistics, LevelsAreThoseOfThePlainComputationToTheLastBit) {
    std::mt19937 random(20261124);
    std::uniform_int_distribution<int> bin(0, 255);
    std::uniform_int_distribution<int> power(-400, 300);
    for (int round = 0; round < 5000; ++round) {
        std::vector<int> bins(static_cast<std::size_t>(1 + bin(random) % 56));
        for (int& value : bins)
            value = bin(random) < 40 ? 0 : bin(random);
        const SampleRecord sample = record(2412, 0, power(random), bins);
        const double level = sampleLevel(sample);
        const double plain = plainLevel(sample);
        ASSERT_TRUE(level == plain || (std::isnan(level) && std::isnan(plain))) << level << " and " << plain;
    }
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
