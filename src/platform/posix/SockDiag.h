#pragma once

#include <linux/inet_diag.h>
#include <linux/netlink.h>
#include <linux/sock_diag.h>
#include <netinet/in.h>

#include <cstdint>

namespace vexa::posix {

/// A question to the kernel about its TCP sockets over IPv4: by its pair of ports about one, or about all.
struct SockDiagRequest {
    nlmsghdr header;
    inet_diag_req_v2 socket;
};

inline SockDiagRequest sockDiagRequest(std::uint16_t flags, std::uint32_t states) {
    SockDiagRequest request{};
    request.header.nlmsg_len = sizeof request;
    request.header.nlmsg_type = SOCK_DIAG_BY_FAMILY;
    request.header.nlmsg_flags = NLM_F_REQUEST | flags;
    request.socket.sdiag_family = AF_INET;
    request.socket.sdiag_protocol = IPPROTO_TCP;
    request.socket.idiag_states = states;
    return request;
}

}  // namespace vexa::posix
