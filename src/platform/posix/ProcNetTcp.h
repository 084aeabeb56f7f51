#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace vexa::posix {

/// A row of the kernel's table of TCP sockets. Addresses are in network byte order, ports in host byte order.
struct TcpSocket {
    std::string localAddress;  ///< Hex digits as the kernel prints them: 8 for IPv4, 32 for IPv6.
    std::string remoteAddress;
    std::uint16_t localPort = 0;
    std::uint16_t remotePort = 0;
    std::uint32_t state = 0;
    std::uint32_t uid = 0;
    std::uint64_t inode = 0;  ///< Of the socket; 0: no process has it any more.
};

enum class TcpSockets { All, Listening };

/// The rows of such a table, each connection once. Those that listen alone cost little, however many others
/// there are. False if it can't be read.
bool readProcNetTcp(const std::string& path, std::vector<TcpSocket>& rows,
                    TcpSockets which = TcpSockets::All);

}  // namespace vexa::posix
