#include "client/machine/ServiceHost.h"

#include <windows.h>

#include <string>

namespace vexa::client {

namespace fs = std::filesystem;

namespace {

constexpr std::size_t kLongestPath = 32768;

}  // namespace

bool hasSimulatedMachines() {
    return false;
}

fs::path serviceBesideThis() {
    std::wstring path(kLongestPath, L'\0');
    path.resize(GetModuleFileNameW(nullptr, path.data(), static_cast<DWORD>(path.size())));
    return fs::path(path).parent_path() / "vexa-service.exe";
}

// The named mutexes are those of the session, and the service finds its machine by itself.

void enterMachine(const MachineFolder& /*machine*/) {}

void describeMachine(ServiceProgram& /*program*/, const MachineFolder& /*machine*/,
                     const StartRequest& /*request*/, unsigned /*controlPort*/) {}

}  // namespace vexa::client
