#pragma once

#include <optional>

#include "client/MachineFolder.h"

namespace vexa::client {

// The hotspot switch in the registry of a machine. The service reads it when it starts and never writes it;
// who turns the switch keeps it in step.

/// True also if there is no such value, as for the service.
bool readHotspotSwitch(const MachineFolder& machine);

/// False if it cannot be written.
bool writeHotspotSwitch(const MachineFolder& machine, bool isOn);

}  // namespace vexa::client
