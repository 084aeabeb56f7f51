#include "simulation/wlan/ServiceEntry.h"

namespace vexa::simulation {

DWORD admit(Machine* machine, HANDLE client, const char* call, std::string_view detail) {
    if (!machine) return kServiceNotActive;
    if (const auto error = machine->faults().nextError(call, detail)) return *error;
    return machine->handles().isOpen(client) ? ERROR_SUCCESS : ERROR_INVALID_HANDLE;
}

}  // namespace vexa::simulation
