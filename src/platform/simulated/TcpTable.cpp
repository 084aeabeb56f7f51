#include "platform/TcpTable.h"

#include <netinet/in.h>

#include <algorithm>
#include <array>
#include <charconv>
#include <cstddef>
#include <cstring>
#include <tuple>
#include <vector>

#include "platform/posix/ProcNetTcp.h"
#include "simulation/Machine.h"

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

}  // namespace

std::uint32_t getTcpTable(TcpTable* table, std::uint32_t& size, bool ordered) {
    simulation::Machine* const machine = simulation::Machine::current();
    if (const auto error = machine ? machine->faults().nextError("GetTcpTable") : std::nullopt) return *error;
    std::vector<posix::TcpSocket> sockets;
    if (!posix::readProcNetTcp("/proc/net/tcp", sockets)) return kErrorGeneralFailure;
    if (!table || size < bytesFor(sockets.size())) {
        size = static_cast<std::uint32_t>(bytesFor(sockets.size() + kSpareRows));
        return kErrorInsufficientBuffer;
    }
    std::vector<TcpRow> rows;
    rows.reserve(sockets.size());
    for (const posix::TcpSocket& socket : sockets)
        rows.push_back(tcpRow(socket));
    if (ordered) std::sort(rows.begin(), rows.end(), comesBefore);
    table->rowCount = static_cast<std::uint32_t>(rows.size());
    if (!rows.empty()) std::memcpy(table->rows, rows.data(), rows.size() * sizeof(TcpRow));
    return kNoError;
}

}  // namespace vexa::platform
