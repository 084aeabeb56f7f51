// Compares the published integers of the analyser with those of the plain loop, over as many records as told:
// random ones, and ones whose mean level lies next to a whole number. `spectral_proof RECORDS [SEED]`; exit
// code 1 if any differ.

#include <algorithm>
#include <array>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <random>
#include <span>
#include <vector>

#include "bench/BareStatistics.h"
#include "spectral/ChannelStatistics.h"
#include "spectral/LevelEstimate.h"
#include "text/LittleEndian.h"

namespace {

using vexa::SampleRecord;
using Random = std::mt19937_64;

int below(Random& random, int limit) {
    return static_cast<int>(random() % static_cast<std::uint64_t>(limit));
}

// One in 64 anywhere in the field, up to where nothing is finite.
int randomPower(Random& random) {
    if (below(random, 64) == 0) return below(random, 65536) - 32768;
    return below(random, 2) == 0 ? below(random, 140) - 20 : below(random, 820) - 410;
}

// From one magnitude alone among zeros, where all levels are whole numbers but for their last bit, to 56
// random ones.
void fillBins(std::span<std::byte> bins, Random& random) {
    const int kinds = 1 + below(random, 4);
    std::array<int, 4> magnitudes{};
    for (int& magnitude : magnitudes)
        magnitude = below(random, 3) == 0 ? below(random, 2) : below(random, 256);
    const int mode = below(random, 4);
    for (std::byte& bin : bins)
        bin = mode == 0 ? static_cast<std::byte>(below(random, 256))
              : mode == 1
                  ? std::byte{0}
                  : static_cast<std::byte>(magnitudes[static_cast<std::size_t>(below(random, kinds))]);
    if (mode == 1) bins[static_cast<std::size_t>(below(random, 56))] = static_cast<std::byte>(magnitudes[0]);
}

SampleRecord randomRecord(Random& random) {
    std::array<std::byte, SampleRecord::kSize> bytes{};
    vexa::writeLittleEndian(bytes, 0, static_cast<std::uint16_t>(2412 + 5 * below(random, 12)));
    vexa::writeLittleEndian(bytes, 2, static_cast<std::uint16_t>(below(random, 101)));
    vexa::writeLittleEndian(bytes, 7, static_cast<std::int16_t>(randomPower(random)));
    fillBins(std::span(bytes).subspan(56, SampleRecord::kBinCount), random);
    return SampleRecord(bytes);
}

// Channels of one record, and channels of a few hundred.
std::vector<SampleRecord> randomPass(Random& random) {
    std::vector<SampleRecord> records;
    const int count = 1 + below(random, below(random, 2) == 0 ? 12 : 4000);
    for (int i = 0; i < count; ++i)
        records.push_back(randomRecord(random));
    return records;
}

struct Counts {
    std::uint64_t records = 0;
    std::uint64_t values = 0;
    std::uint64_t different = 0;
    double worstError = 0.0;
};

void compare(const std::vector<SampleRecord>& records, Counts& counts) {
    const auto ours = vexa::computeChannelValues(records);
    for (const auto& [channel, bare] : vexa::bench::bareChannelValues(records)) {
        const auto found = ours.find(channel);
        const bool isEqual = found != ours.end() && found->second.noise == bare.noise &&
                             found->second.congestion == bare.congestion;
        ++counts.values;
        counts.different += isEqual ? 0 : 1;
    }
    for (const SampleRecord& record : records)
        if (const auto estimate = vexa::estimateLevel(record))
            counts.worstError =
                std::max(counts.worstError, std::fabs(estimate->level - vexa::sampleLevel(record)));
    counts.records += records.size();
}

}  // namespace

int main(int argc, char** argv) {
    const std::uint64_t wanted = argc > 1 ? std::strtoull(argv[1], nullptr, 10) : 1'000'000;
    Random random(argc > 2 ? std::strtoull(argv[2], nullptr, 10) : 1);
    Counts counts;
    while (counts.records < wanted)
        compare(randomPass(random), counts);
    std::printf("%llu records, %llu values, %llu different; worst error of an estimate %.3g dB\n",
                static_cast<unsigned long long>(counts.records),
                static_cast<unsigned long long>(counts.values),
                static_cast<unsigned long long>(counts.different), counts.worstError);
    return counts.different == 0 ? 0 : 1;
}
