#include <benchmark/benchmark.h>

#include <algorithm>
#include <array>
#include <random>
#include <vector>

#include "bench/BareStatistics.h"
#include "spectral/ChannelStatistics.h"
#include "text/LittleEndian.h"

namespace {

using vexa::SampleRecord;

constexpr std::int64_t kRecords = 10'000;
constexpr std::array<std::uint16_t, 8> kFrequencies = {2412, 2437, 2462, 2484, 5180, 5260, 5500, 5825};

SampleRecord randomRecord(std::mt19937& random) {
    std::array<std::byte, SampleRecord::kSize> bytes{};
    for (std::byte& byte : bytes)
        byte = static_cast<std::byte>(random() & 0xFF);
    const auto power = static_cast<std::int16_t>(random() % 120);
    vexa::writeLittleEndian(bytes, 0, kFrequencies[random() % kFrequencies.size()]);
    vexa::writeLittleEndian(bytes, 2, static_cast<std::uint16_t>(random() % 101));
    vexa::writeLittleEndian(bytes, 7, power);
    return SampleRecord(bytes);
}

std::vector<SampleRecord> randomRecords(std::int64_t count) {
    std::mt19937 random(1);
    std::vector<SampleRecord> records;
    for (std::int64_t i = 0; i < count; ++i)
        records.push_back(randomRecord(random));
    return records;
}

// Two loops that differ in what they give would not be comparable.
bool areEqual(const std::vector<SampleRecord>& records) {
    const auto ours = vexa::computeChannelValues(records);
    const auto bare = vexa::bench::bareChannelValues(records);
    return ours.size() == bare.size() &&
           std::equal(ours.begin(), ours.end(), bare.begin(), [](const auto& a, const auto& b) {
               return a.first == b.first && a.second.congestion == b.second.congestion &&
                      a.second.noise == b.second.noise;
           });
}

template <auto Compute>
void pass(benchmark::State& state) {
    const std::vector<SampleRecord> records = randomRecords(state.range(0));
    if (!areEqual(records)) return state.SkipWithError("the two passes disagree");
    for (auto _ : state)
        benchmark::DoNotOptimize(Compute(records));
    state.counters["per_second"] =
        benchmark::Counter(static_cast<double>(state.iterations()), benchmark::Counter::kIsRate);
}

BENCHMARK(pass<vexa::computeChannelValues>)->Name("spectral_pass/ours")->Arg(kRecords);
BENCHMARK(pass<vexa::bench::bareChannelValues>)->Name("spectral_pass/bare")->Arg(kRecords);
BENCHMARK(pass<vexa::computeChannelValues>)->Name("growth/records")->RangeMultiplier(10)->Range(1, 1000);

}  // namespace
