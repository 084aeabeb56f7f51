#pragma once

#include "platform/WlanApi.h"
#include "simulation/Machine.h"

namespace vexa::simulation {

/// The list of the inserted adapters; `size` bytes of it are in use.
Bytes interfaceList(Machine& machine);

/// What WlanQueryInterface answers about an inserted adapter. A result code; `answer` holds the data on
/// success.
DWORD queryInterfaceValue(Machine& machine, std::size_t adapter, WLAN_INTF_OPCODE opcode, Bytes& answer);

}  // namespace vexa::simulation
