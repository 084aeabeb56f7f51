#pragma once

#include "simulation/Machine.h"

namespace vexa::simulation {

/// The machine of this process, made at the first call together with its control channel, as the scenario
/// says; it lives as long as the process. Not to be called while libraries are being loaded: it starts
/// threads and waits for them.
Machine& loadedMachine();

/// Makes registry and files what the scenario says. To be called while this library is being loaded: then
/// they are there before the program's first statement.
void prepareSystem();

}  // namespace vexa::simulation
