#pragma once

#include <chrono>

#include "client/machine/MachineFolder.h"
#include "client/machine/ServiceParent.h"

namespace vexa::client {

/// A service may sleep for ten seconds before it looks whether it is to stop. The user has seen all by then.
inline constexpr std::chrono::milliseconds kDemoStopPatience{500};

/// Prepares a machine for the demo: an airport with a microwave oven, and a log that is on. Gives what starts
/// its service. Throws ClientError.
StartRequest prepareDemoMachine(const TemporaryMachine& machine);

}  // namespace vexa::client
