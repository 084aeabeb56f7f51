#pragma once

#include <string>
#include <vector>

#include "client/TcpEndpoints.h"

namespace vexa::client {

/// The endpoints in a table as the kernel writes it. Throws ClientError if it can't be read.
std::vector<TcpEndpoint> readTcpTable(const std::string& file);

}  // namespace vexa::client
