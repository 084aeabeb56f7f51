#include "platform/TcpTable.h"

#include <winsock2.h>
// After <winsock2.h>.
#include <iphlpapi.h>

#include <cstddef>

namespace vexa::platform {

static_assert(kErrorInsufficientBuffer == ERROR_INSUFFICIENT_BUFFER);
static_assert(sizeof(TcpRow) == sizeof(MIB_TCPROW) && sizeof(TcpTable) == sizeof(MIB_TCPTABLE));
static_assert(offsetof(TcpTable, rows) == offsetof(MIB_TCPTABLE, table));
static_assert(offsetof(TcpRow, localPort) == offsetof(MIB_TCPROW, dwLocalPort));
static_assert(offsetof(TcpRow, remotePort) == offsetof(MIB_TCPROW, dwRemotePort));

namespace {

// The table may grow before the caller comes back with the memory.
constexpr ULONG kSpareRows = 64;

}  // namespace

std::uint32_t getTcpTable(TcpTable* table, std::uint32_t& size, bool ordered) {
    ULONG bytes = size;
    const ULONG result = GetTcpTable(reinterpret_cast<MIB_TCPTABLE*>(table), &bytes, ordered ? TRUE : FALSE);
    size = bytes;
    if (result == ERROR_INSUFFICIENT_BUFFER) size += kSpareRows * static_cast<ULONG>(sizeof(TcpRow));
    return result;
}

}  // namespace vexa::platform
