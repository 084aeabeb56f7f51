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

}  // namespace

bool hasSimulatedMachines() {
    return true;
}

fs::path serviceBesideThis() {
    return fs::read_symlink("/proc/self/exe").parent_path() / "vexa-service";
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
