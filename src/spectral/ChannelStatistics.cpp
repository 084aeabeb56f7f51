#include "spectral/ChannelStatistics.h"

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <limits>

namespace vexa {

namespace {

constexpr double kFloor = -120.0;
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

double sumOfSquares(const SampleRecord& record) {
    std::int64_t sum = 0;
    for (const std::byte bin : record.bins()) {
        const int value = std::to_integer<int>(bin);
        sum += std::int64_t{value} * value;
    }
    return static_cast<double>(sum);
}

struct ChannelSums {
    double level = 0.0;
    double congestion = 0.0;
    int count = 0;
};

ChannelValues valuesOf(const ChannelSums& sums) {
    const double level = withoutInfinity(sums.level) / sums.count;
    const double congestion = withoutInfinity(sums.congestion) / sums.count;
    return {limitToPercent(toInt32(congestion)), limitToPercent(toInt32(level) + 120)};
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

// Neighbouring bins are often equal, and a logarithm costs more than all the rest.
double sampleLevel(const SampleRecord& record) {
    const double total = sumOfSquares(record);
    const double factor = powerOfTen((record.power() - 96) / 10.0);
    double sum = 0.0;
    double level = 0.0;
    int lastBin = -1;
    for (const std::byte bin : record.bins()) {
        const int value = std::to_integer<int>(bin);
        if (value != lastBin) {
            const double magnitude = value == 0 ? 1.0 : value;
            level = 10.0 * std::log10(magnitude * magnitude / total * factor);
            if (level < kFloor) level = kFloor;
            lastBin = value;
        }
        sum += level;
    }
    return sum / static_cast<double>(SampleRecord::kBinCount);
}

// The samples of a channel are summed in their order, as they come: that decides the last bit of the sums.
std::map<int, ChannelValues> computeChannelValues(std::span<const SampleRecord> samples) {
    std::map<int, ChannelSums> sums;
    for (const SampleRecord& record : samples) {
        const auto channel = frequencyToChannel(record.frequency());
        if (!channel) continue;
        ChannelSums& channelSums = sums[*channel];
        channelSums.level += sampleLevel(record);
        channelSums.congestion += record.congestion();
        ++channelSums.count;
    }
    std::map<int, ChannelValues> values;
    for (const auto& [channel, channelSums] : sums)
        values.emplace(channel, valuesOf(channelSums));
    return values;
}

int smoothCongestion(int published, int computed) {
    return published == 0 ? computed : static_cast<int>(0.4 * published + 0.6 * computed);
}

}  // namespace vexa
