#include "spectral/ChannelStatistics.h"

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <limits>

#include "spectral/LevelEstimate.h"

namespace vexa {

namespace {

constexpr double kLargest = std::numeric_limits<double>::max();

int limitToPercent(std::int64_t value) {
    return static_cast<int>(std::clamp<std::int64_t>(value, 0, 100));
}

double withoutInfinity(double sum) {
    return std::fabs(sum) > kLargest ? kLargest : sum;
}

// Truncation toward zero; what has no 32-bit value gives the most negative one.
std::int64_t toInt32(double value) {
    using Limits = std::numeric_limits<std::int32_t>;
    const bool fits =
        value > static_cast<double>(Limits::min()) - 1.0 && value < static_cast<double>(Limits::max()) + 1.0;
    return fits ? static_cast<std::int32_t>(value) : Limits::min();
}

double powerOfTen(double exponent) {
    return exponent < 0.0 ? 1.0 / std::pow(10.0, -exponent) : std::pow(10.0, exponent);
}

struct ChannelSums {
    double level = 0.0;
    double congestion = 0.0;
    std::size_t count = 0;
    bool isExact = true;
    bool hasBound = true;

    void add(const SampleRecord& record);
    double meanLevel() const { return withoutInfinity(level) / static_cast<double>(count); }
    double meanCongestion() const { return congestion / static_cast<double>(count); }
    bool isNoiseCertain() const;
};

void ChannelSums::add(const SampleRecord& record) {
    congestion += record.congestion();
    ++count;
    const auto estimate = estimateLevel(record);
    if (estimate) level += estimate->level;
    isExact = isExact && estimate && estimate->isExact;
    hasBound = hasBound && estimate && count <= kMostEstimates;
}

// The integer changes at whole decibels alone, and above -20 no more.
bool ChannelSums::isNoiseCertain() const {
    if (isExact) return true;
    const double mean = meanLevel();
    const bool isLoudest = mean > kLevelFloor + 100.0 + kEstimateError;
    return hasBound && (isLoudest || std::fabs(mean - std::round(mean)) > kEstimateError);
}

int noiseOf(double meanLevel) {
    return limitToPercent(toInt32(meanLevel) - static_cast<int>(kLevelFloor));
}

// The samples are summed in their order, as they come: that decides the last bit of the sum.
int exactNoise(int channel, std::span<const SampleRecord> samples) {
    ChannelSums sums;
    for (const SampleRecord& record : samples) {
        if (frequencyToChannel(record.frequency()) != channel) continue;
        sums.level += sampleLevel(record);
        ++sums.count;
    }
    return noiseOf(sums.meanLevel());
}

}  // namespace

ChannelOrder orderChannels(std::span<const int> channels) {
    ChannelOrder order;
    for (const int channel : channels)
        order.try_emplace(channel, static_cast<int>(order.size()) + 1);
    return order;
}

std::optional<int> frequencyToChannel(int frequency) {
    if (frequency == 0) return std::nullopt;
    int channel = (frequency - 5000) / 5;
    if (frequency < 2484)
        channel = (frequency - 2407) / 5;
    else if (frequency == 2484)
        channel = 14;
    else if (frequency < 4900)
        channel = 15 + (frequency - 2512) / 20;
    else if (frequency <= 5000)
        channel = (frequency - 4000) / 5;
    return channel == -1 ? std::nullopt : std::optional(channel);
}

double sumOfSquares(const SampleRecord& record) {
    int sum = 0;
    for (const std::byte bin : record.bins()) {
        const int value = std::to_integer<int>(bin);
        sum += value * value;
    }
    return sum;
}

double sampleLevel(const SampleRecord& record) {
    const double total = sumOfSquares(record);
    const double factor = powerOfTen((record.power() + kLevelOfPowerZero) / 10.0);
    double sum = 0.0;
    for (const std::byte bin : record.bins()) {
        const double magnitude = std::max(1, std::to_integer<int>(bin));
        const double level = 10.0 * std::log10(magnitude * magnitude / total * factor);
        sum += level < kLevelFloor ? kLevelFloor : level;
    }
    return sum / static_cast<double>(SampleRecord::kBinCount);
}

// A level is only ever seen as a whole number: nearly is enough, unless it lies next to one.
std::map<int, ChannelValues> computeChannelValues(std::span<const SampleRecord> samples) {
    std::map<int, ChannelSums> sums;
    for (const SampleRecord& record : samples)
        if (const auto channel = frequencyToChannel(record.frequency())) sums[*channel].add(record);
    std::map<int, ChannelValues> values;
    for (const auto& [channel, ofChannel] : sums) {
        const int noise =
            ofChannel.isNoiseCertain() ? noiseOf(ofChannel.meanLevel()) : exactNoise(channel, samples);
        values.emplace(channel, ChannelValues{limitToPercent(toInt32(ofChannel.meanCongestion())), noise});
    }
    return values;
}

int smoothCongestion(int published, int computed) {
    return published == 0 ? computed : static_cast<int>(0.4 * published + 0.6 * computed);
}

}  // namespace vexa
