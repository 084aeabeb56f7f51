#include "platform/posix/SocketOwner.h"

#include <arpa/inet.h>
#include <sys/socket.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstddef>
#include <cstring>
#include <vector>

#include "platform/posix/ProcNetTcp.h"
#include "platform/posix/SockDiag.h"

namespace vexa::posix {

namespace {

constexpr std::uint32_t kEstablished = 1;
constexpr std::uint32_t kAllStates = ~0U;

struct Table {
    const char* path;
    const char* loopback;
};

// The second is for a peer that reaches 127.0.0.1 through an IPv6 socket.
constexpr Table kTables[] = {
    {"/proc/net/tcp", "0100007F"},
    {"/proc/net/tcp6", "0000000000000000FFFF00000100007F"},
};

// A socket that its process has left belongs to root as far as the kernel is concerned.
bool isOwned(std::uint32_t state, std::uint64_t inode) {
    return state == kEstablished && inode != 0;
}

// The kernel finds by it an IPv6 socket with IPv4 addresses, too.
SockDiagRequest requestFor(std::uint16_t localPort, std::uint16_t remotePort) {
    SockDiagRequest request = sockDiagRequest(0, kAllStates);
    inet_diag_sockid& id = request.socket.id;
    id.idiag_sport = htons(localPort);
    id.idiag_dport = htons(remotePort);
    id.idiag_src[0] = id.idiag_dst[0] = htonl(INADDR_LOOPBACK);
    id.idiag_cookie[0] = id.idiag_cookie[1] = INET_DIAG_NOCOOKIE;
    return request;
}

template <class Payload>
bool readPayload(const std::array<char, 512>& answer, std::size_t size, Payload& payload) {
    if (size < NLMSG_HDRLEN + sizeof payload) return false;
    std::memcpy(&payload, answer.data() + NLMSG_HDRLEN, sizeof payload);
    return true;
}

}  // namespace

SocketOwners::SocketOwners()
    : m_netlink(::socket(AF_NETLINK, SOCK_DGRAM | SOCK_CLOEXEC, NETLINK_SOCK_DIAG)) {}

// The kernel has answered when it has taken the question.
SocketOwners::Answer SocketOwners::ask(std::uint16_t localPort, std::uint16_t remotePort,
                                       std::uint32_t& uid) {
    const SockDiagRequest request = requestFor(localPort, remotePort);
    if (!m_netlink || ::send(m_netlink.get(), &request, sizeof request, 0) < 0) return Answer::Unavailable;
    std::array<char, 512> answer{};
    const ssize_t size = ::recv(m_netlink.get(), answer.data(), answer.size(), MSG_DONTWAIT);
    nlmsghdr header{};
    if (size < static_cast<ssize_t>(sizeof header)) return Answer::Unavailable;
    std::memcpy(&header, answer.data(), sizeof header);
    const auto length = static_cast<std::size_t>(size);
    if (nlmsgerr failure{}; header.nlmsg_type == NLMSG_ERROR && readPayload(answer, length, failure))
        return failure.error == -ENOENT ? Answer::NoSocket : Answer::Unavailable;
    inet_diag_msg socket{};
    if (header.nlmsg_type != SOCK_DIAG_BY_FAMILY || !readPayload(answer, length, socket))
        return Answer::Unavailable;
    uid = socket.idiag_uid;
    return isOwned(socket.idiag_state, socket.idiag_inode) ? Answer::Owned : Answer::NotOwned;
}

// A kernel without the module for it knows no socket at all: not even the other end.
std::optional<std::uint32_t> SocketOwners::ownerOf(std::uint16_t localPort, std::uint16_t remotePort) {
    std::uint32_t uid = 0;
    std::uint32_t ignored = 0;
    Answer answer = ask(localPort, remotePort, uid);
    if (answer == Answer::NoSocket && ask(remotePort, localPort, ignored) == Answer::NoSocket)
        answer = Answer::Unavailable;
    if (answer == Answer::Unavailable) return socketOwnerInTable(localPort, remotePort);
    return answer == Answer::Owned ? std::optional(uid) : std::nullopt;
}

std::optional<std::uint32_t> socketOwnerInTable(std::uint16_t localPort, std::uint16_t remotePort) {
    for (const Table& table : kTables) {
        std::vector<TcpSocket> rows;
        if (!readProcNetTcp(table.path, rows)) continue;
        const auto found = std::find_if(rows.begin(), rows.end(), [&](const TcpSocket& row) {
            return row.localPort == localPort && row.remotePort == remotePort &&
                   row.localAddress == table.loopback && row.remoteAddress == table.loopback &&
                   isOwned(row.state, row.inode);
        });
        if (found != rows.end()) return found->uid;
    }
    return std::nullopt;
}

}  // namespace vexa::posix
