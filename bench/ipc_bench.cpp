#include <benchmark/benchmark.h>

#include <algorithm>
#include <chrono>
#include <cstdlib>
#include <string>
#include <vector>

#include "bench/BareServer.h"
#include "bench/BenchClient.h"
#include "bench/OurServers.h"
#include "channel/Envelope.h"
#include "contract/Ports.h"

namespace {

using vexa::bench::BareBroadcaster;
using vexa::bench::BareEchoServer;
using vexa::bench::BenchClient;
using vexa::bench::EchoServer;
using vexa::bench::HotspotServer;
using Clock = std::chrono::steady_clock;

constexpr std::size_t kUnderWay = 64;
const std::string kCommand = R"({"CommandId":"GET_IS_CARD_IN"})";

/// Node's server, which runs already: its port stands in the environment.
class NodeServer {
public:
    static const char* portText() { return std::getenv("VEXA_BENCH_WS_PORT"); }
    std::uint16_t port() const { return m_port; }

private:
    const std::uint16_t m_port = static_cast<std::uint16_t>(std::atoi(portText()));
};

double microsecondsSince(Clock::time_point begin) {
    return std::chrono::duration<double, std::micro>(Clock::now() - begin).count();
}

double percentile(std::vector<double>& values, double part) {
    const auto rank = static_cast<std::ptrdiff_t>(part * static_cast<double>(values.size() - 1));
    std::nth_element(values.begin(), values.begin() + rank, values.end());
    return values[static_cast<std::size_t>(rank)];
}

void report(benchmark::State& state, std::size_t each, std::vector<double>& latencies) {
    const auto count = static_cast<double>(state.iterations()) * static_cast<double>(each);
    state.counters["per_second"] = benchmark::Counter(count, benchmark::Counter::kIsRate);
    if (!latencies.empty()) state.counters["p99_us"] = percentile(latencies, 0.99);
}

// So many commands at once, and the next as many when all are answered.
template <class Server, std::size_t Count>
void commands(benchmark::State& state) {
    Server server;
    BenchClient client(server.port());
    std::vector<double> latencies;
    for (auto _ : state) {
        const auto begin = Clock::now();
        client.sendTogether(kCommand, Count);
        for (std::size_t i = 0; i < Count; ++i) {
            client.receive();
            latencies.push_back(microsecondsSince(begin));
        }
    }
    report(state, Count, latencies);
}

template <class Server>
void fanOut(benchmark::State& state) {
    Server server;
    std::vector<BenchClient> listeners;
    for (std::int64_t i = 0; i < state.range(0); ++i)
        listeners.emplace_back(server.port());
    const std::string message =
        vexa::buildEnvelope("SPECTRAL_ANALYSER_FULL_SCAN_COMPLETED", vexa::contract::kSpectralSource);
    std::vector<double> latencies;
    for (auto _ : state) {
        const auto begin = Clock::now();
        server.sendToAll(message);
        for (BenchClient& listener : listeners)
            listener.receive();
        latencies.push_back(microsecondsSince(begin));
    }
    report(state, 1, latencies);
}

BENCHMARK(commands<HotspotServer, 1>)->Name("one_command/ours")->UseRealTime();
BENCHMARK(commands<BareEchoServer, 1>)->Name("one_command/bare")->UseRealTime();
BENCHMARK(commands<HotspotServer, kUnderWay>)->Name("commands_under_way/ours")->UseRealTime();
BENCHMARK(commands<BareEchoServer, kUnderWay>)->Name("commands_under_way/bare")->UseRealTime();
BENCHMARK(fanOut<EchoServer>)->Name("fan_out/ours")->Arg(200)->UseRealTime();
BENCHMARK(fanOut<BareBroadcaster>)->Name("fan_out/bare")->Arg(200)->UseRealTime();
BENCHMARK(fanOut<EchoServer>)->Name("growth/clients")->RangeMultiplier(10)->Range(1, 1000)->UseRealTime();

}  // namespace

int main(int count, char** arguments) {
    if (NodeServer::portText() != nullptr) {
        benchmark::RegisterBenchmark("one_command/node", commands<NodeServer, 1>)->UseRealTime();
        benchmark::RegisterBenchmark("commands_under_way/node", commands<NodeServer, kUnderWay>)
            ->UseRealTime();
    }
    benchmark::Initialize(&count, arguments);
    benchmark::RunSpecifiedBenchmarks();
    benchmark::Shutdown();
}
