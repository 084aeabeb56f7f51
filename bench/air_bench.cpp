#include <benchmark/benchmark.h>

// The writer whose form clients know.
#if defined(__GNUC__)
#pragma GCC diagnostic ignored "-Wdeprecated-declarations"
#endif

#include <json/writer.h>

#include <malloc.h>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <memory>
#include <string>
#include <unordered_map>
#include <vector>

#include "channel/IpcInProcess.h"
#include "connection/Supplicant.h"
#include "connection/SupplicantMgr.h"
#include "hotspotport/SAHotSpotPortlink.h"
#include "simulation/Machine.h"
#include "simulation/scenario/Scenario.h"

namespace {

namespace fs = std::filesystem;
using vexa::SAHotSpotPortlink;
using vexa::Supplicant;
using vexa::SupplicantMgr;

constexpr int kNetworks = 196;
constexpr int kRealms = 40;
constexpr std::int32_t kPort = 8002;

std::string realmOf(int network, int realm) {
    return "r" + std::to_string(realm) + ".n" + std::to_string(network) + ".example";
}

std::string bssid(int number) {
    char text[18];
    std::snprintf(text, sizeof text, "02:aa:00:00:%02x:%02x", number >> 8, number & 255);
    return text;
}

/// What a network says of its realms: a member of the scenario.
using RealmsOf = std::string (*)(int network);

// Each network has as many realms as this, half of them with EAP-TLS and half with EAP-TTLS.
std::string fortyRealms(int network) {
    std::string realms;
    for (int realm = 0; realm < kRealms; ++realm)
        realms += std::string(realm == 0 ? "" : ",") + R"({"names":[")" + realmOf(network, realm) +
                  R"("],"eapMethods":[)" + (realm % 2 == 0 ? "13" : "21") + "]}";
    return R"("realms":[)" + realms + "]";
}

std::string asHex(const std::string& bytes) {
    std::string hex;
    for (const char byte : bytes)
        for (const int shift : {4, 0})
            hex += "0123456789abcdef"[static_cast<unsigned char>(byte) >> shift & 15];
    return hex;
}

// As many realms as an answer has room for, each of these names, and each with this method 255 times.
std::string hostile(const std::string& names, char method) {
    constexpr std::size_t kRoom = 10236;
    std::string entry{'\0', static_cast<char>(names.size())};
    entry += names + '\xFF';
    for (int i = 0; i < 255; ++i)
        entry += {'\2', method, '\0'};
    const auto size = static_cast<unsigned>(entry.size());
    entry = std::string{static_cast<char>(size & 0xFF), static_cast<char>(size >> 8)} + entry;
    const std::size_t count = (kRoom - 2) / entry.size();
    std::string list{static_cast<char>(count), '\0'};
    for (std::size_t i = 0; i < count; ++i)
        list += entry;
    return R"("naiRealmHex":")" + asHex(list) + "\"";
}

std::string manyNames(int /*network*/) {
    return hostile(std::string(255, ';'), 13);
}

std::string longNames(int /*network*/) {
    return hostile(std::string(255, '\1'), 13);
}

std::string unknownMethods(int /*network*/) {
    return hostile(std::string(255, ';'), 18);
}

std::string scenario(int namesShared, RealmsOf realmsOf) {
    std::string networks;
    for (int network = 0; network < kNetworks; ++network)
        networks += std::string(network == 0 ? "" : ",") + R"({"bssid":")" + bssid(network) +
                    R"(","ssid":"Network )" + std::to_string(network / namesShared) + R"(",)" +
                    realmsOf(network) + "}";
    return R"({"speed":0,"networks":[)" + networks + "]}";
}

/// The service without its threads' time: the clock stands still, so that only the update costs.
class Air {
public:
    Air(int namesShared, RealmsOf realmsOf)
        : m_folder(temporaryFolder()),
          m_machine(vexa::simulation::parseScenario(scenario(namesShared, realmsOf)), m_folder) {
        SupplicantMgr::instance().init();
        SAHotSpotPortlink& server = SAHotSpotPortlink::instance();
        server.updateCardState();
        server.m_hIpc = vexa::IpcCreateServer(1, 0, SAHotSpotPortlink::OnIpcMessage, &server, kPort);
        SupplicantMgr::instance().addSupplicantIfInterfaceExists();
        m_supplicant = SupplicantMgr::instance().findSupplicantByGuid(server.m_interfaceGuid.get());
        m_client = vexa::InProcessClient::connect(kPort);
    }

    ~Air() {
        m_supplicant.reset();
        m_client.reset();
        SupplicantMgr::instance().deinit();
        if (const auto ipc = SAHotSpotPortlink::instance().m_hIpc.exchange(0)) vexa::IpcClose(ipc);
        m_machine.stop();
        fs::remove_all(m_folder);
    }
    Air(const Air&) = delete;
    Air& operator=(const Air&) = delete;

    void update() { m_supplicant->onAnqpQueryCompleted(); }
    std::size_t eventsTaken() { return m_client->receive().size(); }

private:
    static fs::path temporaryFolder() {
        std::string pattern = (fs::temp_directory_path() / "vexa-bench-XXXXXX").string();
        return mkdtemp(pattern.data());
    }

    fs::path m_folder;
    vexa::simulation::Machine m_machine;
    std::shared_ptr<Supplicant> m_supplicant;
    std::unique_ptr<vexa::InProcessClient> m_client;
};

void rate(benchmark::State& state) {
    state.counters["per_second"] =
        benchmark::Counter(static_cast<double>(state.iterations()), benchmark::Counter::kIsRate);
}

double residentMegabytes(const std::string& what) {
    std::ifstream status("/proc/self/status");
    for (std::string line; std::getline(status, line);)
        if (line.starts_with(what)) return std::stod(line.substr(what.size())) / 1024;
    return 0;
}

// How much more memory than before is taken at the most while this runs.
template <class Run>
double peakMegabytes(Run run) {
    malloc_trim(0);
    const double before = residentMegabytes("VmRSS:");
    std::ofstream("/proc/self/clear_refs") << 5;
    run();
    return residentMegabytes("VmHWM:") - before;
}

// One report of the module, with all that follows: the fetch for each network, folding, the list to the
// client.
template <int NamesShared, RealmsOf RealmsOf>
void update(benchmark::State& state) {
    Air air(NamesShared, RealmsOf);
    state.counters["peak_mb"] = peakMegabytes([&] { air.update(); });
    for (auto _ : state) {
        air.update();
        state.PauseTiming();
        if (air.eventsTaken() == 0) return state.SkipWithError("the client hears nothing");
        state.ResumeTiming();
    }
    rate(state);
}

struct BareNetwork {
    std::string name;
    std::vector<std::string> realms;
};

std::vector<BareNetwork> bareReport(int namesShared, int realms) {
    std::vector<BareNetwork> networks;
    for (int network = 0; network < kNetworks; ++network) {
        auto& entry = networks.emplace_back();
        entry.name = "Network " + std::to_string(network / namesShared);
        for (int realm = 0; realm < realms; ++realm)
            entry.realms.push_back(realmOf(network, realm));
    }
    return networks;
}

Json::Value asJson(const BareNetwork& network) {
    Json::Value entry;
    entry["NetWorkName"] = network.name;
    entry["NetworkType"] = 2;
    entry["IsConnected"] = false;
    entry["IsInternetAccess"] = 0;
    entry["RealmFetched"] = true;
    for (const std::string& name : network.realms) {
        Json::Value realm;
        realm["CredentialEapMethod"] = 1;
        realm["RealmName"] = name;
        entry["SupportRealmList"].append(std::move(realm));
    }
    return entry;
}

// The same list from names at hand: folded, and written twice, as a text within the text of an event.
template <int NamesShared, int Realms>
void bareUpdate(benchmark::State& state) {
    const std::vector<BareNetwork> report = bareReport(NamesShared, Realms);
    for (auto _ : state) {
        std::vector<BareNetwork> folded;
        std::unordered_map<std::string, std::size_t> places;
        for (const BareNetwork& network : report) {
            const auto [place, isNew] = places.emplace(network.name, folded.size());
            if (isNew) folded.push_back({network.name, {}});
            auto& realms = folded[place->second].realms;
            realms.insert(realms.end(), network.realms.begin(), network.realms.end());
        }
        Json::Value list;
        for (const BareNetwork& network : folded)
            list.append(asJson(network));
        Json::Value event;
        event["Data"] = Json::StyledWriter().write(list);
        benchmark::DoNotOptimize(Json::StyledWriter().write(event));
    }
    rate(state);
}

BENCHMARK(update<1, fortyRealms>)->Name("air_update_196_names/ours")->Unit(benchmark::kMillisecond);
BENCHMARK(bareUpdate<1, kRealms>)->Name("air_update_196_names/bare")->Unit(benchmark::kMillisecond);
BENCHMARK(update<4, fortyRealms>)->Name("air_update_49_names/ours")->Unit(benchmark::kMillisecond);
BENCHMARK(bareUpdate<4, kRealms>)->Name("air_update_49_names/bare")->Unit(benchmark::kMillisecond);
BENCHMARK(update<1, manyNames>)->Name("air_update_hostile_names/ours")->Unit(benchmark::kMillisecond);
BENCHMARK(bareUpdate<1, 256>)->Name("air_update_hostile_names/bare")->Unit(benchmark::kMillisecond);
BENCHMARK(update<1, longNames>)->Name("air_update_hostile_lengths/ours")->Unit(benchmark::kMillisecond);
BENCHMARK(bareUpdate<1, 256>)->Name("air_update_hostile_lengths/bare")->Unit(benchmark::kMillisecond);
BENCHMARK(update<1, unknownMethods>)->Name("air_update_hostile_methods/ours")->Unit(benchmark::kMillisecond);
BENCHMARK(bareUpdate<1, 0>)->Name("air_update_hostile_methods/bare")->Unit(benchmark::kMillisecond);

}  // namespace
