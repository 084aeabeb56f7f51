#include "platform/TcpTable.h"

#include <netinet/in.h>

#include <algorithm>
#include <array>
#include <charconv>
#include <cstddef>
#include <cstring>
#include <optional>
#include <tuple>
#include <utility>
#include <vector>

#include "platform/Mutex.h"
#include "platform/posix/KernelTcp.h"
#include "platform/simulated/TcpSockets.h"
#include "simulation/Machine.h"
#include "text/NeverDestroyed.h"

namespace vexa::platform {

namespace {

constexpr std::uint32_t kErrorGeneralFailure = 31;

// The table may grow before the caller comes back with the memory.
constexpr std::size_t kSpareRows = 64;

// The kernel's numbers of the states, from 1, and those of the interface.
constexpr std::array<std::uint32_t, 13> kStates = {
    1,   // none
    5,   // established
    3,   // SYN sent
    4,   // SYN received
    6,   // FIN wait 1
    7,   // FIN wait 2
    11,  // time wait
    1,   // closed
    8,   // close wait
    10,  // last ACK
    2,   // listening
    9,   // closing
    4,   // a connection request under way
};

std::uint32_t addressFromHex(const std::string& digits) {
    std::uint32_t address = 0;
    std::from_chars(digits.data(), digits.data() + digits.size(), address, 16);
    return address;
}

TcpRow tcpRow(const posix::TcpSocket& row) {
    return {kStates[row.state < kStates.size() ? row.state : 0], addressFromHex(row.localAddress),
            htons(row.localPort), addressFromHex(row.remoteAddress), htons(row.remotePort)};
}

bool comesBefore(const TcpRow& a, const TcpRow& b) {
    const auto key = [](const TcpRow& row) {
        return std::tuple(ntohl(row.localAddress), ntohs(static_cast<std::uint16_t>(row.localPort)),
                          ntohl(row.remoteAddress), ntohs(static_cast<std::uint16_t>(row.remotePort)));
    };
    return key(a) < key(b);
}

std::size_t bytesFor(std::size_t rows) {
    return offsetof(TcpTable, rows) + rows * sizeof(TcpRow);
}

/// Where the rows come from: the host, or the machine's own list. A caller who comes back with the room that
/// he was told is answered from what he was told of, however the host's table has grown meanwhile.
class TcpSockets {
public:
    void replace(std::vector<posix::TcpSocket> sockets) {
        const LockGuard lock(m_mutex);
        m_own = std::move(sockets);
    }

    std::optional<std::vector<posix::TcpSocket>> read(std::uint32_t room) {
        const LockGuard lock(m_mutex);
        if (room != 0 && room == m_roomTold) return takeSnapshot();
        if (m_own) return m_own;
        std::vector<posix::TcpSocket> sockets;
        const bool isRead = posix::readKernelTcp(sockets) || posix::readProcNetTcp("/proc/net/tcp", sockets);
        return isRead ? std::optional(std::move(sockets)) : std::nullopt;
    }

    std::uint32_t tellRoom(std::vector<posix::TcpSocket> sockets) {
        const LockGuard lock(m_mutex);
        m_roomTold = static_cast<std::uint32_t>(bytesFor(sockets.size() + kSpareRows));
        m_snapshot = std::move(sockets);
        return m_roomTold;
    }

private:
    std::vector<posix::TcpSocket> takeSnapshot() REQUIRES(m_mutex) {
        m_roomTold = 0;
        return std::exchange(m_snapshot, {});
    }

    Mutex m_mutex{"TCP sockets"};
    std::optional<std::vector<posix::TcpSocket>> m_own GUARDED_BY(m_mutex);
    std::vector<posix::TcpSocket> m_snapshot GUARDED_BY(m_mutex);
    std::uint32_t m_roomTold GUARDED_BY(m_mutex) = 0;
};

TcpSockets& tcpSockets() {
    static NeverDestroyed<TcpSockets> sockets;
    return sockets.get();
}

}  // namespace

void setTcpSockets(std::vector<posix::TcpSocket> sockets) {
    tcpSockets().replace(std::move(sockets));
}

std::uint32_t getTcpTable(TcpTable* table, std::uint32_t& size, bool ordered) {
    simulation::Machine* const machine = simulation::Machine::current();
    if (const auto error = machine ? machine->faults().nextError("GetTcpTable") : std::nullopt) return *error;
    auto sockets = tcpSockets().read(size);
    if (!sockets) return kErrorGeneralFailure;
    if (!table || size < bytesFor(sockets->size())) {
        size = tcpSockets().tellRoom(*std::move(sockets));
        return kErrorInsufficientBuffer;
    }
    std::vector<TcpRow> rows;
    rows.reserve(sockets->size());
    for (const posix::TcpSocket& socket : *sockets)
        rows.push_back(tcpRow(socket));
    if (ordered) std::sort(rows.begin(), rows.end(), comesBefore);
    table->rowCount = static_cast<std::uint32_t>(rows.size());
    if (!rows.empty()) std::memcpy(table->rows, rows.data(), rows.size() * sizeof(TcpRow));
    return kNoError;
}

}  // namespace vexa::platform
