#pragma once

#include <optional>

#include "client/MachineFolder.h"

namespace vexa::client {

// What the service and its clients share in the registry of a machine.

/// The method of the connection that the service has made: kMethodTls, kMethodTtls, or 0 if there is none of
/// its own. Nothing before it has ever written it.
std::optional<int> readConnectionMethod(const MachineFolder& machine);

}  // namespace vexa::client
