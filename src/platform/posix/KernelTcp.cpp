#include "platform/posix/KernelTcp.h"

#include <arpa/inet.h>
#include <sys/socket.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstddef>
#include <cstdio>
#include <cstring>
#include <span>
#include <string>

#include "platform/posix/Descriptor.h"
#include "platform/posix/SockDiag.h"

namespace vexa::posix {

namespace {

// From established to a connection request under way. Behind them stand sockets that have a port and do not
// use it, which the file does not show.
constexpr std::uint32_t kStatesOfFile = (1U << 13) - 2;

// The largest piece that the kernel makes.
constexpr std::size_t kPiece = 32768;

enum class Piece { More, Last, Failed };

// Digits as in the file: of the bytes in network order, read as a number of this host.
std::string addressText(std::uint32_t address) {
    std::array<char, 9> text{};
    std::snprintf(text.data(), text.size(), "%08X", address);
    return text.data();
}

template <class Payload>
bool readPayload(std::span<const char> message, Payload& payload) {
    if (message.size() < NLMSG_HDRLEN + sizeof payload) return false;
    std::memcpy(&payload, message.data() + NLMSG_HDRLEN, sizeof payload);
    return true;
}

bool addRow(std::span<const char> message, std::vector<TcpSocket>& rows) {
    inet_diag_msg socket{};
    if (!readPayload(message, socket)) return false;
    rows.push_back({addressText(socket.id.idiag_src[0]), addressText(socket.id.idiag_dst[0]),
                    ntohs(socket.id.idiag_sport), ntohs(socket.id.idiag_dport), socket.idiag_state,
                    socket.idiag_uid, socket.idiag_inode});
    return true;
}

// The end brings the error with it, if there was one.
bool isGoodEnd(std::span<const char> message) {
    int error = 0;
    return readPayload(message, error) && error == 0;
}

Piece readPiece(std::span<const char> piece, std::vector<TcpSocket>& rows) {
    while (piece.size() >= sizeof(nlmsghdr)) {
        nlmsghdr header{};
        std::memcpy(&header, piece.data(), sizeof header);
        if (header.nlmsg_len < sizeof header || header.nlmsg_len > piece.size()) return Piece::Failed;
        const auto message = piece.first(header.nlmsg_len);
        if (header.nlmsg_type == NLMSG_DONE) return isGoodEnd(message) ? Piece::Last : Piece::Failed;
        if (header.nlmsg_type != SOCK_DIAG_BY_FAMILY || !addRow(message, rows)) return Piece::Failed;
        piece = piece.subspan(std::min<std::size_t>(NLMSG_ALIGN(header.nlmsg_len), piece.size()));
    }
    return Piece::More;
}

}  // namespace

bool readKernelTcp(std::vector<TcpSocket>& rows) {
    const Descriptor netlink(::socket(AF_NETLINK, SOCK_DGRAM | SOCK_CLOEXEC, NETLINK_SOCK_DIAG));
    const SockDiagRequest request = sockDiagRequest(NLM_F_DUMP, kStatesOfFile);
    if (!netlink || ::send(netlink.get(), &request, sizeof request, 0) < 0) return false;
    rows.clear();
    std::vector<char> buffer(kPiece);
    for (Piece piece = Piece::More; piece != Piece::Last;) {
        const ssize_t size = ::recv(netlink.get(), buffer.data(), buffer.size(), 0);
        if (size < 0 && errno == EINTR) continue;
        if (size <= 0) return false;
        piece = readPiece(std::span(buffer).first(static_cast<std::size_t>(size)), rows);
        if (piece == Piece::Failed) return false;
    }
    return true;
}

}  // namespace vexa::posix
