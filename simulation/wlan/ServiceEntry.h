#pragma once

#include <string_view>

#include "simulation/Machine.h"
#include "simulation/parts/MachineCode.h"

namespace vexa::simulation {

/// The error of every call while no machine lives.
inline constexpr DWORD kServiceNotActive = 1062;

/// What every call meets first: an error that was asked for, then a handle that isn't open. `detail` narrows
/// the faults, as Faults says.
DWORD admit(Machine* machine, HANDLE client, const char* call, std::string_view detail = {});

}  // namespace vexa::simulation
