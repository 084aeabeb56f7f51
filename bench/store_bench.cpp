#include <benchmark/benchmark.h>
#include <fcntl.h>
#include <json/value.h>
#include <unistd.h>

#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>

#include "config/Config.h"
#include "connection/SupplicantMgr.h"
#include "hotspotport/SAHotSpotPortlink.h"
#include "simulation/Machine.h"
#include "simulation/scenario/Scenario.h"

namespace {

namespace fs = std::filesystem;
using vexa::SAHotSpotPortlink;
using vexa::SupplicantMgr;
using vexa::platform::LockGuard;

/// A machine with the service's store on it, and tables of any size.
class Store {
public:
    static Store& instance() {
        static Store store;
        return store;
    }

    ~Store() {
        m_machine.stop();
        fs::remove_all(m_folder);
    }
    Store(const Store&) = delete;
    Store& operator=(const Store&) = delete;

    fs::path file() const { return m_folder / "Public" / "Roaming" / "Korvane" / "config.xml"; }

    std::string content() const {
        std::ifstream stream(file(), std::ios::binary);
        return {std::istreambuf_iterator<char>(stream), std::istreambuf_iterator<char>()};
    }

    void fill(int credentials) const {
        std::ofstream(file(), std::ios::binary | std::ios::trunc) << document(credentials);
        SupplicantMgr::instance().reloadData();
    }

    static void send(const char* command, const std::string& data) {
        Json::Value message;
        message["CommandId"] = command;
        message["Data"] = data;
        SAHotSpotPortlink::instance().HandleCommand(message);
    }

private:
    Store() : m_folder(temporaryFolder()), m_machine(vexa::simulation::parseScenario("{}"), m_folder) {
        SupplicantMgr::instance().init();
        SAHotSpotPortlink::instance().updateCardState();
        SupplicantMgr::instance().addSupplicantIfInterfaceExists();
    }

    static fs::path temporaryFolder() {
        std::string pattern = (fs::temp_directory_path() / "vexa-bench-XXXXXX").string();
        return mkdtemp(pattern.data());
    }

    static std::string document(int credentials) {
        std::string all;
        std::string references;
        for (int id = 1; id <= credentials; ++id) {
            const std::string number = std::to_string(id);
            all +=
                "<credential><id>" + number +
                "</id><type>eapttls</type><accesstype>alluser</accesstype><creator>KORVANE-PC\\user</creator>"
                "<eap>2</eap><autoconnect>true</autoconnect><credname>Name " +
                number + "</credname><realm>realm" + number +
                ".example</realm><username>someone</username><password>secret</password></credential>";
            references +=
                "<credential><id>" + number + "</id><priority>" + number + "</priority></credential>";
        }
        return "<?xml version=\"1.0\" encoding=\"UTF-8\"?><configurations><global><nextcredid>" +
               std::to_string(credentials + 1) + "</nextcredid></global><credentials>" + all +
               "</credentials><users><user><username>KORVANE-PC\\user</username><credentials>" + references +
               "</credentials></user></users></configurations>";
    }

    fs::path m_folder;
    vexa::simulation::Machine m_machine;
};

std::string addition() {
    return R"({"CredentialEapMethod":2,"Type":1,"RealName":"new.example","Username":"u","Password":"p"})";
}

std::string object(const char* member, int value, const char* rest = "") {
    return std::string("{\"") + member + "\":" + std::to_string(value) + rest + "}";
}

template <class Body>
void timed(benchmark::State& state, Body body) {
    const auto start = std::chrono::steady_clock::now();
    body();
    state.SetIterationTime(std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count());
}

void countRate(benchmark::State& state) {
    state.counters["per_second"] =
        benchmark::Counter(static_cast<double>(state.iterations()), benchmark::Counter::kIsRate);
}

// The same commands on a long table ("ours") and on a short one ("bare"): how the cost grows with the table.
template <int Size>
void add(benchmark::State& state) {
    Store::instance().fill(Size);
    int id = Size;
    for (auto _ : state) {
        timed(state, [] { Store::send("ADD_CREDENTIAL", addition()); });
        Store::send("DELETE_CREDENTIAL", object("Id", ++id));
    }
    countRate(state);
}

template <int Size>
void remove(benchmark::State& state) {
    Store::instance().fill(Size);
    int id = Size;
    for (auto _ : state) {
        Store::send("ADD_CREDENTIAL", addition());
        timed(state, [&] { Store::send("DELETE_CREDENTIAL", object("Id", ++id)); });
    }
    countRate(state);
}

template <int Size>
void move(benchmark::State& state) {
    Store::instance().fill(Size);
    bool isDown = false;
    for (auto _ : state) {
        const std::string data =
            object("Id", 1, isDown ? ",\"Order\":0" : (",\"Order\":" + std::to_string(Size)).c_str());
        isDown = !isDown;
        timed(state, [&] { Store::send("SET_POSITION_CREDENTIAL", data); });
    }
    countRate(state);
}

constexpr int kLong = 2000;
constexpr int kShort = 200;

BENCHMARK(add<kLong>)->Name("add_2000_beside_200/ours")->UseManualTime()->Unit(benchmark::kMillisecond);
BENCHMARK(add<kShort>)->Name("add_2000_beside_200/bare")->UseManualTime()->Unit(benchmark::kMillisecond);
BENCHMARK(remove<kLong>)->Name("delete_2000_beside_200/ours")->UseManualTime()->Unit(benchmark::kMillisecond);
BENCHMARK(remove<kShort>)
    ->Name("delete_2000_beside_200/bare")
    ->UseManualTime()
    ->Unit(benchmark::kMillisecond);
BENCHMARK(move<kLong>)->Name("move_2000_beside_200/ours")->UseManualTime()->Unit(benchmark::kMillisecond);
BENCHMARK(move<kShort>)->Name("move_2000_beside_200/bare")->UseManualTime()->Unit(benchmark::kMillisecond);

template <int Size>
void save(benchmark::State& state) {
    Store::instance().fill(Size);
    const LockGuard lock(vexa::g_hs20Lock);
    vexa::Config& config = SupplicantMgr::instance().config();
    for (auto _ : state)
        if (config.saveConfig(config.lockFile()) != vexa::kSuccess) state.SkipWithError("the save failed");
    countRate(state);
}

bool bareWrite(const fs::path& path, const std::string& content) {
    const std::string temporary = path.string() + ".bare";
    const int file = ::open(temporary.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0600);
    if (file < 0) return false;
    const bool isWritten =
        ::write(file, content.data(), content.size()) == static_cast<ssize_t>(content.size()) &&
        ::fsync(file) == 0;
    ::close(file);
    return isWritten && ::rename(temporary.c_str(), path.c_str()) == 0;
}

// The same bytes, and as often as our save brings them to the disk.
template <int Size>
void bareSave(benchmark::State& state) {
    Store& store = Store::instance();
    store.fill(Size);
    const std::string content = store.content();
    for (auto _ : state)
        for (int section = 0; section < 3; ++section)
            if (!bareWrite(store.file(), content)) state.SkipWithError("the write failed");
    countRate(state);
}

BENCHMARK(save<kLong>)->Name("durable_save_2000/ours")->UseRealTime()->Unit(benchmark::kMillisecond);
BENCHMARK(bareSave<kLong>)->Name("durable_save_2000/bare")->UseRealTime()->Unit(benchmark::kMillisecond);
BENCHMARK(save<kShort>)->Name("durable_save_200/ours")->UseRealTime()->Unit(benchmark::kMillisecond);
BENCHMARK(bareSave<kShort>)->Name("durable_save_200/bare")->UseRealTime()->Unit(benchmark::kMillisecond);

}  // namespace
