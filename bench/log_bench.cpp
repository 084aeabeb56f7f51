#include <benchmark/benchmark.h>

#include <atomic>

#include "base/DiagnosticLog.h"

namespace {

void countRate(benchmark::State& state) {
    state.counters["per_second"] =
        benchmark::Counter(static_cast<double>(state.iterations()), benchmark::Counter::kIsRate);
}

std::atomic<bool> isOn{false};

// As a call of the log: arguments that are passed whatever comes of them, and then the test.
[[gnu::noinline]] void bareLog(int level, const char* format, ...) {
    if (!isOn) return;
    benchmark::DoNotOptimize(level);
    benchmark::DoNotOptimize(format);
}

void disabledLog(benchmark::State& state) {
    int id = 0;
    for (auto _ : state)
        vexa::Log(3, "Credential: id=%d, name=%s, priority=%d", ++id, "name", 7);
    countRate(state);
}

void bareFlag(benchmark::State& state) {
    int id = 0;
    for (auto _ : state)
        bareLog(3, "Credential: id=%d, name=%s, priority=%d", ++id, "name", 7);
    countRate(state);
}

BENCHMARK(disabledLog)->Name("disabled_log/ours");
BENCHMARK(bareFlag)->Name("disabled_log/bare");

}  // namespace
