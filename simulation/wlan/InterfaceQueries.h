#pragma once

#include "platform/WlanApi.h"
#include "simulation/Machine.h"

namespace vexa::simulation {

/// What WlanEnumInterfaces gives: the inserted adapters, in order, and not a byte more.
Bytes interfaceList(Machine& machine);

/// What WlanQueryInterface answers about an inserted adapter. A result code; `answer` holds the data on
/// success.
DWORD queryInterfaceValue(Machine& machine, std::size_t adapter, WLAN_INTF_OPCODE opcode, Bytes& answer);

}  // namespace vexa::simulation
