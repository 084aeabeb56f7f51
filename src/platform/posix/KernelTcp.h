#pragma once

#include <vector>

#include "platform/posix/ProcNetTcp.h"

namespace vexa::posix {

/// The rows of /proc/net/tcp, asked of the kernel. It goes through its table once for them, for the file once
/// with each piece that is read and once more for its end; the table of a host with much memory has hundreds
/// of thousands of places, whoever is in them. False if the kernel can't be asked.
bool readKernelTcp(std::vector<TcpSocket>& rows);

}  // namespace vexa::posix
