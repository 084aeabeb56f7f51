#pragma once

#include <vector>

#include "platform/posix/ProcNetTcp.h"

namespace vexa::platform {

/// From now on the machine's TCP table holds these sockets, instead of those of the host: for stories that
/// must not depend on what else runs there.
void setTcpSockets(std::vector<posix::TcpSocket> sockets);

}  // namespace vexa::platform
