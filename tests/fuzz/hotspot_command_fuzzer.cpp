// Any bytes as a message of the hotspot port. Whatever it does, the file can be read and holds what the table
// holds.

#include <algorithm>

#include "base/NetworkListLock.h"
#include "config/Config.h"
#include "config/ResultCodes.h"
#include "connection/SupplicantMgr.h"
#include "fuzz/FuzzMachine.h"
#include "hotspotport/SAHotSpotPortlink.h"

namespace vexa::test {
namespace {

using platform::LockGuard;

constexpr std::string_view kConfig =
    "<c><global><create_new_dump_file>false</create_new_dump_file><enabledump>true</enabledump>"
    "<nextcredid>1</nextcredid></global><credentials/><users/></c>";
constexpr int kMessagesOfOneTable = 200;

SupplicantMgr& manager() {
    return SupplicantMgr::instance();
}

// One of an access that doesn't exist can be added, but isn't read again.
std::ptrdiff_t storedCredentials() {
    const LockGuard lock(g_hs20Lock);
    const auto all = manager().config().credentials().copyCredentialPointers();
    return std::count_if(all.begin(), all.end(), [](const Credential* credential) {
        return credential->m_accessType == CRED_ACCESS_ALL_USER ||
               credential->m_accessType == CRED_ACCESS_PER_USER;
    });
}

/// The service without its ports: a supplicant, and the server that takes the client's messages.
class Service {
public:
    Service() {
        m_machine.write("config.xml", kConfig);
        require(manager().init() == kSuccess, "the configuration is read");
        server().updateCardState();
        require(manager().addSupplicantIfInterfaceExists() == kSuccess, "the adapter has a supplicant");
    }
    ~Service() { manager().deinit(); }
    Service(const Service&) = delete;
    Service& operator=(const Service&) = delete;

    void receive(std::string_view message) {
        SAHotSpotPortlink::OnIpcMessage(message.data(), static_cast<std::uint32_t>(message.size()),
                                        &server());
        if (++m_messages % kMessagesOfOneTable == 0) startAgain();
    }

private:
    static SAHotSpotPortlink& server() { return SAHotSpotPortlink::instance(); }

    void startAgain() {
        const std::ptrdiff_t stored = storedCredentials();
        require(manager().reloadData() == kSuccess, "the file can be read");
        require(storedCredentials() == stored, "the file holds what the table held");
        m_machine.write("config.xml", kConfig);
        m_machine.write("Dump/hs20log.txt_user.txt", "");
        require(manager().reloadData() == kSuccess && storedCredentials() == 0,
                "an empty file gives an empty table");
    }

    FuzzMachine m_machine;
    int m_messages = 0;
};

}  // namespace
}  // namespace vexa::test

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    static vexa::test::Service service;
    service.receive(vexa::test::textOf(data, size));
    return 0;
}
