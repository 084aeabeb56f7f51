#pragma once

#include <string>

#include "client/machine/MachineFolder.h"

namespace vexa::client {

/// Why there may be nothing in the diagnostic log, in one line; empty if it is on.
std::string whyLogIsOff(const MachineFolder& machine);

}  // namespace vexa::client
