#include <benchmark/benchmark.h>

#include <algorithm>
#include <chrono>
#include <memory>
#include <string>
#include <vector>

#include "bench/BareServer.h"
#include "bench/BenchClient.h"
#include "bench/OurServers.h"
#include "channel/Envelope.h"
#include "channel/JsonText.h"
#include "contract/Ports.h"

namespace {

using vexa::bench::BareBroadcaster;
using vexa::bench::BareEchoServer;
using vexa::bench::BenchClient;
using vexa::bench::EchoServer;
using vexa::bench::HotspotServer;
using Clock = std::chrono::steady_clock;

constexpr int kListeners = 200;
const std::string kCommand = R"({"CommandId":"GET_IS_CARD_IN"})";

/// The same answers as the hotspot port's, on the bare server.
class BareHotspotServer : public BareEchoServer {
public:
    BareHotspotServer() : BareEchoServer(&answer) {}

private:
    static std::string answer(std::string_view message) {
        const auto id = vexa::readText(vexa::parseJsonText(message), "CommandId");
        const bool isKnown = id == "GET_IS_CARD_IN";
        return vexa::buildEnvelope(isKnown ? "CARD_PLUG_OUT" : "", vexa::contract::kHotspotSource, "");
    }
};

double percentile(std::vector<double>& values, double part) {
    const auto rank = static_cast<std::ptrdiff_t>(part * static_cast<double>(values.size() - 1));
    std::nth_element(values.begin(), values.begin() + rank, values.end());
    return values[static_cast<std::size_t>(rank)];
}

void report(benchmark::State& state, std::vector<double>& latencies) {
    state.counters["per_second"] =
        benchmark::Counter(static_cast<double>(state.iterations()), benchmark::Counter::kIsRate);
    if (!latencies.empty()) state.counters["p99_us"] = percentile(latencies, 0.99);
}

template <class Server>
void roundTrip(benchmark::State& state) {
    Server server;
    BenchClient client(server.port());
    std::vector<double> latencies;
    for (auto _ : state) {
        const auto begin = Clock::now();
        client.send(kCommand);
        client.receive();
        latencies.push_back(std::chrono::duration<double, std::micro>(Clock::now() - begin).count());
    }
    report(state, latencies);
}

template <class Server>
void fanOut(benchmark::State& state) {
    Server server;
    std::vector<BenchClient> listeners;
    for (int i = 0; i < kListeners; ++i)
        listeners.emplace_back(server.port());
    const std::string message =
        vexa::buildEnvelope("SPECTRAL_ANALYSER_FULL_SCAN_COMPLETED", vexa::contract::kSpectralSource);
    std::vector<double> latencies;
    for (auto _ : state) {
        const auto begin = Clock::now();
        server.sendToAll(message);
        for (BenchClient& listener : listeners)
            listener.receive();
        latencies.push_back(std::chrono::duration<double, std::micro>(Clock::now() - begin).count());
    }
    report(state, latencies);
}

BENCHMARK(roundTrip<EchoServer>)->Name("round_trip_echo/ours")->UseRealTime();
BENCHMARK(roundTrip<BareEchoServer>)->Name("round_trip_echo/bare")->UseRealTime();
BENCHMARK(roundTrip<HotspotServer>)->Name("round_trip_command/ours")->UseRealTime();
BENCHMARK(roundTrip<BareHotspotServer>)->Name("round_trip_command/bare")->UseRealTime();
BENCHMARK(fanOut<EchoServer>)->Name("fan_out_200/ours")->UseRealTime();
BENCHMARK(fanOut<BareBroadcaster>)->Name("fan_out_200/bare")->UseRealTime();

}  // namespace
