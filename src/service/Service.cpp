#include "service/Service.h"

#include <optional>

#include "base/AdapterIdentity.h"
#include "base/DiagnosticLog.h"
#include "base/StandardOutput.h"
#include "connection/Supplicant.h"
#include "connection/SupplicantMgr.h"
#include "contract/Process.h"
#include "contract/Version.h"
#include "platform/NamedMutex.h"
#include "service/CommandLine.h"
#include "service/IpcServers.h"
#include "text/NeverDestroyed.h"
#include "text/ScopeGuard.h"

namespace vexa {

namespace {

using platform::NamedMutex;

constexpr int kExitNormal = 0;
constexpr int kExitFailed = 1;

// The process ends owning the mutex: a parent that waits for it learns of the end by the abandoned mutex.
void waitForStop() {
    static NeverDestroyed<NamedMutex> stopMutex(contract::kStopMutex, NamedMutex::Owner::No);
    stopMutex.get().wait();
}

void removePresentSupplicant(SupplicantMgr& manager) {
    const auto guid = presentAdapter();
    const auto supplicant = guid ? manager.findSupplicantByGuid(*guid) : nullptr;
    if (!supplicant) return;
    supplicant->deinit();
    manager.removeSupplicant(*supplicant);
}

}  // namespace

int runService(const std::wstring* commandLine) {
    std::optional<NamedMutex> instanceMutex(std::in_place, contract::kInstanceMutex, NamedMutex::Owner::Yes);
    const ScopeGuard releaseInstance([&] { instanceMutex.reset(); });
    if (instanceMutex->existedBefore()) return kExitNormal;

    SupplicantMgr& manager = SupplicantMgr::instance();
    if (manager.init() != kSuccess) {
        Log(4, "Initialize SupplicantMgr failed.");
        return kExitFailed;
    }
    if (commandLine == nullptr || commandLine->empty()) {
        Log(4, "No command line arguments, exit.");
        return kExitFailed;
    }
    std::wstring arguments = *commandLine;
    std::uint32_t saPort = 0;
    std::uint32_t hs20Port = 0;
    if (!parseCommandLine(arguments, saPort, hs20Port)) {
        Log(4, "Checking command line arguments failed.");
        return kExitFailed;
    }
    Log(4, "Check command line arguments succeeded, saPort=%d, hs20Port=%d", static_cast<int>(saPort),
        static_cast<int>(hs20Port));

    createIpcServers(static_cast<std::int32_t>(saPort), hs20Port);
    manager.addSupplicantIfInterfaceExists();
    waitForStop();

    destroySpectralServer();
    removePresentSupplicant(manager);
    manager.deinit();
    return kExitNormal;
}

bool tellVersion(const std::wstring& commandLine) {
    if (commandLine != L"--version") return false;
    printToStandardOutput("vexa-service %s\n", contract::version());
    return true;
}

}  // namespace vexa
