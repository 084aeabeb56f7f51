#pragma once

#include <cstdint>
#include <string>

namespace vexa {

/// Reads "saPort hs20Port" and checks that both ports are free. Cuts `commandLine` at its first blank. False,
/// with both ports 0: not two numbers, a token of 32 characters or more, a port in use, or a TCP table that
/// can't be read.
bool parseCommandLine(std::wstring& commandLine, std::uint32_t& saPort, std::uint32_t& hs20Port);

/// False if the TCP table can't be read. `isFree`: no row of the table, whatever its state, has this local
/// port.
bool isTcpPortFree(bool& isFree, std::uint16_t port);

}  // namespace vexa
