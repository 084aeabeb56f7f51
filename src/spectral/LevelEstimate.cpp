#include "spectral/LevelEstimate.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <cstdint>

#include "spectral/ChannelStatistics.h"

namespace vexa {

namespace {

// Beyond it no level means anything; within it nothing here overflows, and no level is above 512 dB.
constexpr int kLargestPower = 400;

// What a factor of two in the product of all magnitudes adds to the mean of their levels.
constexpr double kDecibelsPerOctave = 20.0 / SampleRecord::kBinCount * 0.30102999566398119521;

// 10 ^ ((-24 - power) / 10): with the sum of squares, the square of the magnitude whose level is the floor.
double floorShare(int power) {
    static const auto shares = [] {
        std::array<double, 2 * kLargestPower + 1> all{};
        double of = -kLargestPower;
        for (double& share : all)
            share = std::pow(10.0, (kLevelFloor - kLevelOfPowerZero - of++) / 10.0);
        return all;
    }();
    const int index = power + kLargestPower;
    return shares[static_cast<std::size_t>(index)];
}

double magnitude(std::byte bin, double least) {
    return std::max(static_cast<double>(std::to_integer<int>(bin)), least);
}

// Four products beside each other, since each waits for its own last factor only. 255 ^ 56 is below 1e135.
double productOfMagnitudes(const SampleRecord& record, double least) {
    const auto bins = record.bins();
    static_assert(SampleRecord::kBinCount % 4 == 0);
    double a = 1.0, b = 1.0, c = 1.0, d = 1.0;
    for (std::size_t i = 0; i < bins.size(); i += 4) {
        a *= magnitude(bins[i], least);
        b *= magnitude(bins[i + 1], least);
        c *= magnitude(bins[i + 2], least);
        d *= magnitude(bins[i + 3], least);
    }
    return a * b * (c * d);
}

// At most (56 * 255 ^ 2) ^ 28, below 1e184.
double toThe28th(double value) {
    const double fourth = value * value * value * value;
    const double eighth = fourth * fourth;
    return eighth * eighth * eighth * fourth;
}

}  // namespace

// With s the sum of squares and p the power, the level of a bin of magnitude m is 10 * log10(m^2 / s) + p -
// 96, but no less than -120: the level of max(m, f), where f^2 = s * 10 ^ ((-24 - p) / 10). A zero counts
// as 1. So the mean of 56 levels is 20 / 56 * log10(product of max(m, f, 1) / s^28) + p - 96: no bin needs to
// be told from one at the floor, where max() lets no error grow.
//
// The error, with u = 2^-53: f has less than 8 u, a product of 56 factors with their roundings 56 * 9 u, s^28
// less than 28 u, the quotient 540 u in all, which is 0.16 * 540 u < 1e-14 in dB; the binary logarithm is
// below 612 and its last bits below 1.2e-13, of which 0.11 times count; all else rounds at 512 at most. That
// is less than 1e-12. The exact order has 5 u in each quotient (3e-15 dB), last bits of 1e-13 in each level,
// and 56 additions below 2^15 of 2^-38 each: less than 1e-11 for the mean. A sum of N records rounds by N *
// 512 * u for each of them on either side, 6e-8 for a million: in all a tenth of kEstimateError.
std::optional<LevelEstimate> estimateLevel(const SampleRecord& record) {
    const int power = record.power();
    const double total = sumOfSquares(record);
    if (total == 0.0 || power < -kLargestPower || power > kLargestPower) return std::nullopt;
    const double least = std::sqrt(total * floorShare(power));
    if (least > 256.0) return LevelEstimate{kLevelFloor, true};
    const double quotient = productOfMagnitudes(record, std::max(least, 1.0)) / toThe28th(total);
    return LevelEstimate{kDecibelsPerOctave * std::log2(quotient) + power + kLevelOfPowerZero, false};
}

}  // namespace vexa
