#include "bench/BareStatistics.h"

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <limits>
#include <vector>

namespace vexa::bench {

namespace {

struct ChannelSample {
    double binPowerSum = 0.0;
    SampleRecord record;
};

int channelOf(int frequency) {
    if (frequency == 0) return -1;
    if (frequency < 2484) return (frequency - 2407) / 5;
    if (frequency == 2484) return 14;
    if (frequency < 4900) return 15 + (frequency - 2512) / 20;
    if (frequency <= 5000) return (frequency - 4000) / 5;
    return (frequency - 5000) / 5;
}

double levelOf(const ChannelSample& sample) {
    const double exponent = (sample.record.power() - 96) / 10.0;
    const double factor = exponent < 0.0 ? 1.0 / std::pow(10.0, -exponent) : std::pow(10.0, exponent);
    double sum = 0.0;
    for (const std::byte bin : sample.record.bins()) {
        const auto raw = std::to_integer<int>(bin);
        const double value = raw == 0 ? 1.0 : raw;
        double level = 10.0 * std::log10((value * value / sample.binPowerSum) * factor);
        if (level < -120.0) level = -120.0;
        sum += level;
    }
    return sum / 56.0;
}

std::int64_t truncated(double value) {
    constexpr double kTooLarge = 2147483648.0;
    if (!(value > -kTooLarge - 1.0 && value < kTooLarge)) return std::numeric_limits<std::int32_t>::min();
    return static_cast<std::int32_t>(value);
}

int limited(std::int64_t value) {
    return static_cast<int>(std::min<std::int64_t>(100, std::max<std::int64_t>(0, value)));
}

double finite(double sum) {
    constexpr double kLargest = std::numeric_limits<double>::max();
    return std::fabs(sum) > kLargest ? kLargest : sum;
}

BareValues valuesOf(std::vector<ChannelSample>& samples) {
    double level = 0.0;
    double congestion = 0.0;
    for (ChannelSample& sample : samples) {
        for (const std::byte bin : sample.record.bins()) {
            const double value = std::to_integer<int>(bin);
            sample.binPowerSum += value * value;
        }
        level += levelOf(sample);
        congestion += sample.record.congestion();
    }
    const auto count = static_cast<double>(samples.size());
    return {limited(truncated(finite(congestion) / count)), limited(truncated(finite(level) / count) + 120)};
}

}  // namespace

std::map<int, BareValues> bareChannelValues(std::span<const SampleRecord> samples) {
    std::map<int, std::vector<ChannelSample>> byChannel;
    for (const SampleRecord& record : samples) {
        const int channel = channelOf(record.frequency());
        if (channel != -1) byChannel[channel].push_back({0.0, record});
    }
    std::map<int, BareValues> values;
    for (auto& [channel, ofChannel] : byChannel)
        values[channel] = valuesOf(ofChannel);
    return values;
}

}  // namespace vexa::bench
