#include "client/machine/ServiceHost.h"

#include <cstdlib>
#include <string>

#include "client/machine/MachineFolder.h"
#include "client/machine/ServiceParent.h"
#include "client/machine/ServiceProcess.h"

namespace vexa::client {

namespace fs = std::filesystem;

namespace {

constexpr const char* kMachineVariable = "VEXA_MACHINE";
constexpr const char* kService = "vexa-service";

}  // namespace

bool hasSimulatedMachines() {
    return true;
}

// Where they were built it lies in this program's own folder, where they were installed among the programs
// that nobody calls by name.
fs::path serviceBesideThis() {
    const fs::path folder = fs::read_symlink("/proc/self/exe").parent_path();
    const fs::path installed = folder.parent_path() / "libexec" / "vexa" / kService;
    std::error_code ignored;
    return fs::exists(installed, ignored) ? installed : folder / kService;
}

// The named mutexes live in the machine's folder.
void enterMachine(const MachineFolder& machine) {
    ::setenv(kMachineVariable, machine.path().c_str(), 1);
}

void describeMachine(ServiceProgram& program, const MachineFolder& machine, const StartRequest& request,
                     unsigned controlPort) {
    program.variables[kMachineVariable] = machine.path().string();
    auto& control = program.variables["VEXA_CONTROL_PORT"];
    if (controlPort != 0) control = std::to_string(controlPort);
    if (request.builtInScenario) {
        program.variables["VEXA_SCENARIO"] = std::nullopt;
    } else if (!request.scenario.empty()) {
        program.variables["VEXA_SCENARIO"] = fs::absolute(request.scenario).string();
    }
}

}  // namespace vexa::client
