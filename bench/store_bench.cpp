#include <benchmark/benchmark.h>
#include <fcntl.h>
#include <unistd.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <memory>
#include <string>

#include "connection/Supplicant.h"
#include "connection/SupplicantMgr.h"
#include "hotspotport/SAHotSpotPortlink.h"
#include "simulation/Machine.h"
#include "simulation/scenario/Scenario.h"

namespace {

namespace fs = std::filesystem;
using vexa::SAHotSpotPortlink;
using vexa::SupplicantMgr;

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

    void fill(std::int64_t credentials) const {
        std::ofstream(file(), std::ios::binary | std::ios::trunc) << document(credentials);
        SupplicantMgr::instance().reloadData();
    }

    /// One change of a credential's text, as a client asks for it. The same twice would be none.
    void change() {
        m_input.password = std::to_wstring(++m_changes);
        m_supplicant->updateCredential(m_input);
    }

    bool isChangeSaved() const {
        return content().find("<password>" + std::to_string(m_changes) + "</password>") != std::string::npos;
    }

private:
    Store() : m_folder(temporaryFolder()), m_machine(vexa::simulation::parseScenario("{}"), m_folder) {
        SupplicantMgr::instance().init();
        SAHotSpotPortlink::instance().updateCardState();
        SupplicantMgr::instance().addSupplicantIfInterfaceExists();
        m_supplicant = SupplicantMgr::instance().findSupplicantByGuid(
            SAHotSpotPortlink::instance().m_interfaceGuid.get());
        m_input.id = 1;
        m_input.autoConnect = true;
        m_input.realm = L"realm1.example";
        m_input.username = L"someone";
    }

    static fs::path temporaryFolder() {
        std::string pattern = (fs::temp_directory_path() / "vexa-bench-XXXXXX").string();
        return mkdtemp(pattern.data());
    }

    static std::string document(std::int64_t credentials) {
        std::string all;
        std::string references;
        for (std::int64_t id = 1; id <= credentials; ++id) {
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
    std::shared_ptr<vexa::Supplicant> m_supplicant;
    vexa::CredentialInput m_input;
    int m_changes = 0;
};

void countRate(benchmark::State& state) {
    state.counters["per_second"] =
        benchmark::Counter(static_cast<double>(state.iterations()), benchmark::Counter::kIsRate);
}

void change(benchmark::State& state) {
    Store& store = Store::instance();
    store.fill(state.range(0));
    store.change();  // the first one behind a reading takes the file apart
    for (auto _ : state)
        store.change();
    if (!store.isChangeSaved()) state.SkipWithError("the change is not in the file");
    countRate(state);
}

// What no save can do without: the bytes on the disk under another name, the name, and the folder that holds
// it.
bool bareSave(const fs::path& path, const std::string& content) {
    const std::string temporary = path.string() + ".bare";
    const int file = ::open(temporary.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0600);
    if (file < 0) return false;
    const bool isWritten =
        ::write(file, content.data(), content.size()) == static_cast<ssize_t>(content.size()) &&
        ::fsync(file) == 0;
    ::close(file);
    if (!isWritten || ::rename(temporary.c_str(), path.c_str()) != 0) return false;
    const int folder = ::open(path.parent_path().c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
    const bool isFlushed = folder >= 0 && ::fsync(folder) == 0;
    ::close(folder);
    return isFlushed;
}

void bareChange(benchmark::State& state) {
    const Store& store = Store::instance();
    store.fill(state.range(0));
    const std::string content = store.content();
    for (auto _ : state)
        if (!bareSave(store.file(), content)) state.SkipWithError("the write failed");
    countRate(state);
}

BENCHMARK(change)->Name("durable_change/ours")->Arg(200)->Arg(2000)->UseRealTime();
BENCHMARK(bareChange)->Name("durable_change/bare")->Arg(200)->Arg(2000)->UseRealTime();
BENCHMARK(change)->Name("growth/credentials")->RangeMultiplier(10)->Range(1, 1000)->UseRealTime();

}  // namespace
