#include "platform/posix/MachineFolder.h"

#include <cstdlib>

namespace vexa::posix {

namespace {

const char* environment(const char* name) {
    const char* const value = std::getenv(name);  // NOLINT(concurrency-mt-unsafe): nothing here sets any
    return value && *value ? value : nullptr;
}

}  // namespace

std::filesystem::path machineFolder() {
    if (const char* const machine = environment("VEXA_MACHINE")) return machine;
    if (const char* const state = environment("XDG_STATE_HOME")) {
        return std::filesystem::path(state) / "vexa" / "machine";
    }
    if (const char* const home = environment("HOME"))
        return std::filesystem::path(home) / ".local" / "state" / "vexa" / "machine";
    return {};
}

}  // namespace vexa::posix
