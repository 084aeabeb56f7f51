#pragma once

#include <cstdint>
#include <memory>

#include "channel/IpcWebSocketServer.h"
#include "simulation/Machine.h"

namespace vexa::simulation {

/// Serves the control channel of a machine: every message is an action or a query, its answer goes back to
/// the client that asked. One message is carried out at a time, in order of arrival.
///
/// Null if the port can't be had. The machine must outlive the server, and be stopped before it: a message
/// that is being carried out then ends.
std::shared_ptr<IpcWebSocketServer> startControlServer(Machine& machine, std::int32_t port);

}  // namespace vexa::simulation
