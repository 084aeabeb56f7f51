#pragma once

#include "client/machine/MachineFolder.h"

namespace vexa::client {

/// Prepares a machine for the demo: an airport with a microwave oven, and a log that is on. Throws
/// ClientError.
void prepareDemoMachine(const MachineFolder& machine);

}  // namespace vexa::client
