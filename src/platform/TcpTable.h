#pragma once

#include <cstdint>

namespace vexa::platform {

/// One TCP endpoint of the machine, IPv4. Addresses and ports are in network byte order; of a port only the
/// low 16 bits count.
struct TcpRow {
    std::uint32_t state;
    std::uint32_t localAddress;
    std::uint32_t localPort;
    std::uint32_t remoteAddress;
    std::uint32_t remotePort;
};

/// The table as the operating system writes it: the rows stand directly behind the count.
struct TcpTable {
    std::uint32_t rowCount;
    TcpRow rows[1];
};

inline constexpr std::uint32_t kNoError = 0;
inline constexpr std::uint32_t kErrorInsufficientBuffer = 122;

/// Fills `table`, a buffer of `size` bytes. kErrorInsufficientBuffer: too small, `size` now holds what it
/// takes; any other result but kNoError is the operating system's error.
std::uint32_t getTcpTable(TcpTable* table, std::uint32_t& size, bool ordered);

}  // namespace vexa::platform
