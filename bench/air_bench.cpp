#include <benchmark/benchmark.h>

// The writer whose form clients know.
#if defined(__GNUC__)
#pragma GCC diagnostic ignored "-Wdeprecated-declarations"
#endif

#include <json/writer.h>

#include <cstdio>
#include <cstdlib>
#include <filesystem>
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

// Each network has as many realms as this, half of them with EAP-TLS and half with EAP-TTLS.
std::string scenario(int namesShared) {
    std::string networks;
    for (int network = 0; network < kNetworks; ++network) {
        std::string realms;
        for (int realm = 0; realm < kRealms; ++realm)
            realms += std::string(realm == 0 ? "" : ",") + R"({"names":[")" + realmOf(network, realm) +
                      R"("],"eapMethods":[)" + (realm % 2 == 0 ? "13" : "21") + "]}";
        networks += std::string(network == 0 ? "" : ",") + R"({"bssid":")" + bssid(network) +
                    R"(","ssid":"Network )" + std::to_string(network / namesShared) + R"(","realms":[)" +
                    realms + "]}";
    }
    return R"({"speed":0,"networks":[)" + networks + "]}";
}

/// The service without its threads' time: the clock stands still, so that only the update costs.
class Air {
public:
    explicit Air(int namesShared)
        : m_folder(temporaryFolder()),
          m_machine(vexa::simulation::parseScenario(scenario(namesShared)), m_folder) {
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

// One report of the module, with all that follows: the fetch for each network, folding, the list to the
// client.
template <int NamesShared>
void update(benchmark::State& state) {
    Air air(NamesShared);
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

std::vector<BareNetwork> bareReport(int namesShared) {
    std::vector<BareNetwork> networks;
    for (int network = 0; network < kNetworks; ++network) {
        auto& entry = networks.emplace_back();
        entry.name = "Network " + std::to_string(network / namesShared);
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
template <int NamesShared>
void bareUpdate(benchmark::State& state) {
    const std::vector<BareNetwork> report = bareReport(NamesShared);
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

BENCHMARK(update<1>)->Name("air_update_196_names/ours")->Unit(benchmark::kMillisecond);
BENCHMARK(bareUpdate<1>)->Name("air_update_196_names/bare")->Unit(benchmark::kMillisecond);
BENCHMARK(update<4>)->Name("air_update_49_names/ours")->Unit(benchmark::kMillisecond);
BENCHMARK(bareUpdate<4>)->Name("air_update_49_names/bare")->Unit(benchmark::kMillisecond);

}  // namespace
