#pragma once

#include <cstdint>
#include <optional>

#include "platform/posix/Descriptor.h"

namespace vexa::posix {

/// Asks the kernel for single sockets, however many there are.
class SocketOwners {
public:
    SocketOwners();

    /// The user whose process has the end `localPort` of an established connection with `remotePort`, both on
    /// 127.0.0.1. Nothing if no process has it any more: the kernel then names root.
    std::optional<std::uint32_t> ownerOf(std::uint16_t localPort, std::uint16_t remotePort);

private:
    enum class Answer { Owned, NotOwned, NoSocket, Unavailable };
    Answer ask(std::uint16_t localPort, std::uint16_t remotePort, std::uint32_t& uid);

    Descriptor m_netlink;
};

/// The same from the table of all sockets, for a kernel that can't be asked.
std::optional<std::uint32_t> socketOwnerInTable(std::uint16_t localPort, std::uint16_t remotePort);

}  // namespace vexa::posix
