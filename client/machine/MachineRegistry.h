#pragma once

#include <optional>

#include "client/machine/MachineFolder.h"

namespace vexa::client {

// What the service and its clients share in the registry of a machine.

/// The hotspot switch. The service reads it when it starts and never writes it; who turns the switch keeps it
/// in step. True also if there is no such value, as for the service.
bool readHotspotSwitch(const MachineFolder& machine);

/// False if it cannot be written.
bool writeHotspotSwitch(const MachineFolder& machine, bool isOn);

/// The method of the connection that the service has made: kMethodTls, kMethodTtls, or 0 if there is none of
/// its own. Nothing before it has ever written it.
std::optional<int> readConnectionMethod(const MachineFolder& machine);

}  // namespace vexa::client
