#include <benchmark/benchmark.h>

// The writer whose form clients know.
#if defined(__GNUC__)
#pragma GCC diagnostic ignored "-Wdeprecated-declarations"
#endif

#include <json/writer.h>

#include <malloc.h>
#include <array>
#include <chrono>
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
#include "platform/ClockControl.h"
#include "simulation/Machine.h"
#include "simulation/scenario/JsonPlace.h"
#include "simulation/scenario/JsonText.h"
#include "simulation/scenario/Scenario.h"
#include "unit/hotspot/WireBytes.h"

namespace {

namespace fs = std::filesystem;
using vexa::SAHotSpotPortlink;
using vexa::Supplicant;
using vexa::SupplicantMgr;

constexpr int kNetworks = 196;  // as many as a report has room for
constexpr int kRealms = 40;
constexpr std::int32_t kPort = 8002;

/// The realms of a network bear other names when the air has changed.
enum class Names { First, Others };

std::string realmOf(int network, int realm, Names names = Names::First) {
    return (names == Names::First ? "r" : "s") + std::to_string(realm) + ".n" + std::to_string(network) +
           ".example";
}

std::string bssid(int number) {
    char text[18];
    std::snprintf(text, sizeof text, "02:aa:00:00:%02x:%02x", static_cast<unsigned>(number) >> 8 & 255U,
                  static_cast<unsigned>(number) & 255U);
    return text;
}

/// What a network says of its realms: a member of the scenario.
using RealmsOf = std::string (*)(int network, Names names);

// Each network has as many realms as this, half of them with EAP-TLS and half with EAP-TTLS.
std::string fortyRealms(int network, Names names) {
    std::string realms;
    for (int realm = 0; realm < kRealms; ++realm)
        realms += std::string(realm == 0 ? "" : ",") + R"({"names":[")" + realmOf(network, realm, names) +
                  R"("],"eapMethods":[)" + (realm % 2 == 0 ? "13" : "21") + "]}";
    return R"("realms":[)" + realms + "]";
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
    return R"("naiRealmHex":")" + vexa::test::hexOf(vexa::test::bytesOfText(list)) + "\"";
}

std::string manyNames(int /*network*/, Names /*names*/) {
    return hostile(std::string(255, ';'), 13);
}

std::string longNames(int /*network*/, Names /*names*/) {
    return hostile(std::string(255, '\1'), 13);
}

std::string unknownMethods(int /*network*/, Names /*names*/) {
    return hostile(std::string(255, ';'), 18);
}

struct AirSetup {
    int networks = kNetworks;
    int namesShared = 1;
    RealmsOf realmsOf = fortyRealms;
};

std::string scenario(const AirSetup& setup) {
    std::string networks;
    for (int network = 0; network < setup.networks; ++network)
        networks += std::string(network == 0 ? "" : ",") + R"({"bssid":")" + bssid(network) +
                    R"(","ssid":"Network )" + std::to_string(network / setup.namesShared) + R"(",)" +
                    setup.realmsOf(network, Names::First) + "}";
    return R"({"speed":0,"networks":[)" + networks + "]}";
}

// What changes in the scenario when all realms bear these names.
std::vector<Json::Value> changesTo(const AirSetup& setup, Names names) {
    std::vector<Json::Value> changes;
    for (int network = 0; network < setup.networks; ++network) {
        std::string error;
        changes.push_back(
            vexa::simulation::parseJson(
                R"({"bssid":")" + bssid(network) + "\"," + setup.realmsOf(network, names) + "}", error)
                .value());
    }
    return changes;
}

/// The service while the clock stands still, so that only the update costs.
class Air {
public:
    explicit Air(const AirSetup& setup)
        : m_folder(temporaryFolder()),
          m_machine(vexa::simulation::parseScenario(scenario(setup)), m_folder),
          m_changes{changesTo(setup, Names::First), changesTo(setup, Names::Others)} {
        vexa::platform::setClockSpeed(0);
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
        vexa::platform::requestAdvance(std::chrono::minutes(1));  // whoever sleeps is waited for
        SupplicantMgr::instance().deinit();
        if (const auto ipc = SAHotSpotPortlink::instance().m_hIpc.exchange(0)) vexa::IpcClose(ipc);
        m_machine.stop();
        fs::remove_all(m_folder);
    }
    Air(const Air&) = delete;
    Air& operator=(const Air&) = delete;

    /// Gives all realms other names than they have.
    void change() {
        m_turn = 1 - m_turn;
        for (const Json::Value& change : m_changes[m_turn])
            m_machine.airspace().change(vexa::simulation::JsonPlace(change, ""));
    }

    void update() { m_supplicant->onAnqpQueryCompleted(); }
    std::size_t eventsTaken() { return m_client->receive().size(); }

private:
    static fs::path temporaryFolder() {
        std::string pattern = (fs::temp_directory_path() / "vexa-bench-XXXXXX").string();
        return mkdtemp(pattern.data());
    }

    fs::path m_folder;
    vexa::simulation::Machine m_machine;
    const std::array<std::vector<Json::Value>, 2> m_changes;
    std::size_t m_turn = 0;
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
void update(benchmark::State& state, const AirSetup& setup, bool isChanging) {
    Air air(setup);
    state.counters["peak_mb"] = peakMegabytes([&] { air.update(); });
    for (auto _ : state) {
        state.PauseTiming();
        if (air.eventsTaken() == 0) return state.SkipWithError("the client hears nothing");
        if (isChanging) air.change();
        state.ResumeTiming();
        air.update();
    }
    rate(state);
}

void changed(benchmark::State& state) {
    update(state, {}, true);
}

void unchanged(benchmark::State& state) {
    update(state, {}, false);
}

void growth(benchmark::State& state) {
    update(state, {.networks = static_cast<int>(state.range(0))}, true);
}

template <int NamesShared, RealmsOf RealmsOf>
void special(benchmark::State& state) {
    update(state, {.namesShared = NamesShared, .realmsOf = RealmsOf}, false);
}

struct BareNetwork {
    std::string name;
    std::vector<std::string> realms;
};

std::vector<BareNetwork> bareReport() {
    std::vector<BareNetwork> networks;
    for (int network = 0; network < kNetworks; ++network) {
        auto& entry = networks.emplace_back();
        entry.name = "Network " + std::to_string(network);
        for (int realm = 0; realm < kRealms; ++realm)
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
void bareUpdate(benchmark::State& state) {
    const std::vector<BareNetwork> report = bareReport();
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

constexpr auto kUnit = benchmark::kMillisecond;

BENCHMARK(changed)->Name("air_update/ours")->Unit(kUnit);
BENCHMARK(bareUpdate)->Name("air_update/bare")->Unit(kUnit);
BENCHMARK(unchanged)->Name("air_unchanged/ours")->Unit(kUnit);
BENCHMARK(growth)->Name("growth/networks")->Arg(1)->Arg(10)->Arg(100)->Arg(kNetworks)->Unit(kUnit);

// What the air may hold at its worst; their peak of memory is a counter.
BENCHMARK(special<4, fortyRealms>)->Name("air_shared_names/ours")->Unit(kUnit);
BENCHMARK(special<1, manyNames>)->Name("air_hostile_names/ours")->Unit(kUnit);
BENCHMARK(special<1, longNames>)->Name("air_hostile_lengths/ours")->Unit(kUnit);
BENCHMARK(special<1, unknownMethods>)->Name("air_hostile_methods/ours")->Unit(kUnit);

}  // namespace
