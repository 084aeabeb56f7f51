#include "platform/KnownFolders.h"

#include <atomic>

#include "contract/Store.h"
#include "platform/posix/OwnerFiles.h"
#include "platform/simulated/HostPath.h"
#include "simulation/Machine.h"

namespace vexa::platform {

namespace {

// The scenario's configuration is there before the first program looks for it. Only the process that runs on
// the machine asks for this folder, and it asks before it reads: so a process that has found itself to be the
// second leaves the file alone.
void provideConfiguration(const simulation::Machine& machine) {
    static std::atomic<bool> isProvided{false};
    if (!machine.scenario().config || isProvided.exchange(true)) return;
    posix::replaceFile(contract::storeFolder(machine.folder() / "Public") / contract::kConfigFile,
                       *machine.scenario().config);
}

}  // namespace

std::optional<std::wstring> publicFolder() {
    const simulation::Machine* const machine = simulation::Machine::current();
    if (machine == nullptr) return std::nullopt;
    provideConfiguration(*machine);
    return kPublicFolder;
}

}  // namespace vexa::platform
