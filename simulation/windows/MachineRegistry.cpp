// The registry of a machine whose WLAN service alone is simulated: that of the system. The service reads it
// without coming by here.

#include "simulation/parts/MachineRegistry.h"

#include "simulation/windows/SystemRegistry.h"

namespace vexa::simulation {

MachineRegistry::MachineRegistry(const std::vector<ClassKeyEntry>& /*classKey*/,
                                 std::filesystem::path /*file*/) {}

bool MachineRegistry::setAutoConnect(const std::optional<std::string>& text) {
    return writeAutoConnect(text);
}

Json::Value MachineRegistry::content() const {
    return readProductKey();
}

}  // namespace vexa::simulation
