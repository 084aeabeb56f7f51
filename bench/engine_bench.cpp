#include <benchmark/benchmark.h>
#include <unistd.h>

#include <cstdlib>
#include <ctime>
#include <filesystem>
#include <string>
#include <unordered_map>
#include <vector>

#include "engine/world/ConnectStory.h"
#include "platform/seeded/Seeded.h"

// One round of the connecting thread: every network in range beside every credential. Time is the machine's,
// so ten seconds of it are one round and nothing else; what is measured is the CPU.

namespace {

using namespace std::chrono_literals;
using namespace vexa::test;

constexpr int kNetworks = 196;
constexpr int kRealms = 40;
constexpr int kCredentials = 500;

World* g_world = nullptr;

std::string realmName(int number) {
    return "realm" + std::to_string(number) + ".provider.example";
}

std::string realmsOf(int network) {
    std::string text;
    for (int i = 0; i < kRealms; ++i)
        text += (i == 0 ? "" : ",") + (R"({"names":[")" + realmName(network % 5 * kRealms + i)) +
                R"("],"eapMethods":[21]})";
    return R"("realms":[)" + text + "]";
}

// Two networks of five have realms that credentials fit, and so many of them that each finds hundreds.
std::string scenario() {
    std::vector<std::string> networks;
    for (int i = 0; i < kNetworks; ++i)
        networks.push_back(network(i, "network" + std::to_string(i), realmsOf(i)));
    std::vector<StoredCredential> credentials;
    for (int id = 1; id <= kCredentials; ++id)
        credentials.push_back({.id = id, .realm = realmName(id % (2 * kRealms))});
    const std::string refused =
        R"(,"timeline":[{"atMs":0,"do":"fail","call":"WlanConnect","error":50,"times":1000000000}])";
    return air(networks, storing(credentials, {.log = false}) + refused);
}

double cpuSeconds() {
    return static_cast<double>(std::clock()) / CLOCKS_PER_SEC;
}

void countRate(benchmark::State& state) {
    state.counters["per_second"] =
        benchmark::Counter(static_cast<double>(state.iterations()), benchmark::Counter::kIsRate);
}

std::size_t connectRequests() {
    std::size_t count = 0;
    for (const Json::Value& call : g_world->perform(R"({"query":"calls"})"))
        if (call["call"] == "WlanConnect") ++count;
    g_world->perform(R"({"do":"clearCalls"})");
    return count;
}

void round(benchmark::State& state) {
    connectRequests();
    for (auto _ : state) {
        const double start = cpuSeconds();
        g_world->advance(10s);
        state.SetIterationTime(cpuSeconds() - start);
    }
    if (connectRequests() != static_cast<std::size_t>(state.iterations()))
        state.SkipWithError("an iteration was not one round with one request");
    countRate(state);
}

struct BareCredential {
    std::string realm;
    int priority;
};

void bareRound(benchmark::State& state) {
    std::vector<std::vector<std::string>> networks;
    for (int i = 0; i < kNetworks; ++i) {
        auto& names = networks.emplace_back();
        for (int j = 0; j < kRealms; ++j)
            names.push_back(realmName(i % 5 * kRealms + j));
    }
    std::vector<BareCredential> credentials;
    for (int id = 1; id <= kCredentials; ++id)
        credentials.push_back({realmName(id % (2 * kRealms)), id});
    for (auto _ : state) {
        const double start = cpuSeconds();
        int best = kCredentials + 1;
        for (const auto& names : networks) {
            std::unordered_map<std::string_view, int> offered;
            for (const std::string& name : names)
                offered[name] = 21;
            for (const BareCredential& credential : credentials)
                if (offered.contains(credential.realm)) best = std::min(best, credential.priority);
        }
        benchmark::DoNotOptimize(best);
        state.SetIterationTime(cpuSeconds() - start);
    }
    countRate(state);
}

BENCHMARK(round)->Name("connecting_round/ours")->UseManualTime()->Unit(benchmark::kMillisecond);
BENCHMARK(bareRound)->Name("connecting_round/bare")->UseManualTime()->Unit(benchmark::kMillisecond);

}  // namespace

int main(int count, char** arguments) {
    benchmark::Initialize(&count, arguments);
    std::string pattern = (std::filesystem::temp_directory_path() / "vexa-bench-XXXXXX").string();
    const std::filesystem::path folder = mkdtemp(pattern.data());
    vexa::platform::runSeeded(1, [&] {
        World world(scenario(), folder);
        world.advance(60s);
        g_world = &world;
        benchmark::RunSpecifiedBenchmarks();
        world.stop();
    });
    std::filesystem::remove_all(folder);
    std::fflush(nullptr);
    _exit(0);
}
