#include "platform/DebugOutput.h"

#include <string>

#include "platform/posix/MachineFolder.h"
#include "platform/posix/OwnerFiles.h"
#include "simulation/Machine.h"
#include "simulation/parts/MachineCode.h"
#include "text/TextConversion.h"

namespace vexa::platform {

void outputDebugString(std::string_view text) {
    const simulation::MachineCode here;
    if (!text.empty() && text.back() == '\n') text.remove_suffix(1);
    const simulation::Machine* const machine = simulation::Machine::current();
    const auto folder = machine ? machine->folder() : posix::machineFolder();
    posix::appendToFile(folder / "debug.log", std::string(text) + "\n");
}

void outputDebugString(std::wstring_view text) {
    const simulation::MachineCode here;
    outputDebugString(utf8FromWide(text));
}

}  // namespace vexa::platform
