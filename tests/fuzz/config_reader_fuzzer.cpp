// Any bytes as config.xml. A file that isn't read is left alone; one that is read and saved reads the same
// again.

#include <algorithm>
#include <set>

#include "base/NetworkListLock.h"
#include "config/Config.h"
#include "config/ResultCodes.h"
#include "fuzz/FuzzMachine.h"

namespace vexa::test {
namespace {

using platform::LockGuard;

std::string contentOf(Config& config) REQUIRES(g_hs20Lock) {
    std::string text = std::to_string(config.nextCredId());
    for (const Credential* c : config.credentials().copyCredentialPointers()) {
        for (const int number : {c->m_id, c->m_priority, c->m_type, c->m_accessType, c->m_eapMethod})
            text += " " + std::to_string(number);
        for (const std::wstring* part :
             {&c->m_credName, &c->m_realm, &c->m_username, &c->m_password, &c->m_caCert})
            for (const wchar_t unit : *part)
                text += "," + std::to_string(static_cast<std::uint32_t>(unit));
    }
    return text;
}

// At the end of the range an id that is there twice can't be repaired, and a place can't be told from having
// none.
bool isRegular(Config& config) REQUIRES(g_hs20Lock) {
    const auto all = config.credentials().copyCredentialPointers();
    std::set<std::int32_t> ids;
    return std::all_of(all.begin(), all.end(), [&](const Credential* credential) {
        return ids.insert(credential->m_id).second && credential->m_priority < CRED_PRIORITY_LOWEST - 1;
    });
}

void readAndSave(FuzzMachine& machine, std::string_view file) {
    machine.write("config.xml", file);
    const LockGuard lock(g_hs20Lock);
    Config config;
    require(config.initPaths() == kSuccess, "the paths are there");
    if (config.readConfig(nullptr) != kSuccess) {
        require(config.saveConfig(config.lockFile()) != kSuccess, "what isn't read isn't saved");
        require(machine.read("config.xml") == file, "what isn't read is left alone");
        return;
    }
    const bool isSaved = config.saveConfig(config.lockFile()) == kSuccess;
    Config again;
    bool isChanged = false;
    require(again.initPaths() == kSuccess && again.readConfig(&isChanged) == kSuccess,
            "what was saved is read");
    if (!isSaved || !isRegular(config)) return;
    require(!isChanged, "what was saved need not be saved again");
    require(contentOf(again) == contentOf(config), "what was saved reads the same");
}

}  // namespace
}  // namespace vexa::test

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    static vexa::test::FuzzMachine machine;
    vexa::test::readAndSave(machine, vexa::test::textOf(data, size));
    return 0;
}
