#include "platform/DebugOutput.h"

#include <string>

#include "platform/simulated/MachineFolder.h"
#include "simulation/Machine.h"
#include "simulation/parts/OwnerFiles.h"
#include "simulation/text/Text.h"

namespace vexa::platform {

void outputDebugString(std::string_view text) {
    if (!text.empty() && text.back() == '\n') text.remove_suffix(1);
    const simulation::Machine* const machine = simulation::Machine::current();
    const auto folder = machine ? machine->folder() : machineFolder();
    simulation::appendToFile(folder / "debug.log", std::string(text) + "\n");
}

void outputDebugString(std::wstring_view text) {
    outputDebugString(simulation::utf8(std::u32string(text.begin(), text.end())));
}

}  // namespace vexa::platform
