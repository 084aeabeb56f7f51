#include "platform/posix/ProcNetTcp.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <cstddef>
#include <fstream>
#include <string_view>
#include <system_error>
#include <unordered_set>
#include <utility>

namespace vexa::posix {

namespace {

constexpr std::uint32_t kListening = 10;

// slot, local, remote, state, queues, timer, retransmissions, uid, timeout, inode, and more
enum Field { kSlot, kLocal, kRemote, kState, kUid = 7, kInode = 9, kFieldCount };
using Fields = std::array<std::string_view, kFieldCount>;

// A busy host has tens of thousands of rows, and each of them is read at every start.
Fields fieldsOf(std::string_view line) {
    Fields fields;
    std::size_t begin = 0;
    for (std::string_view& field : fields) {
        begin = std::min(line.find_first_not_of(' ', begin), line.size());
        const std::size_t end = std::min(line.find(' ', begin), line.size());
        field = line.substr(begin, end - begin);
        begin = end;
    }
    return fields;
}

template <class Number>
bool readNumber(std::string_view text, Number& number, int base = 10) {
    return std::from_chars(text.data(), text.data() + text.size(), number, base).ec == std::errc();
}

// "0100007F:1F90"
bool readEndpoint(std::string_view text, std::string& address, std::uint16_t& port) {
    const auto colon = text.find(':');
    if (colon == std::string_view::npos) return false;
    address = text.substr(0, colon);
    return readNumber(text.substr(colon + 1), port, 16);
}

bool readRow(const Fields& fields, TcpSocket& row) {
    return readEndpoint(fields[kLocal], row.localAddress, row.localPort) &&
           readEndpoint(fields[kRemote], row.remoteAddress, row.remotePort) &&
           readNumber(fields[kState], row.state, 16) && readNumber(fields[kUid], row.uid) &&
           readNumber(fields[kInode], row.inode);
}

}  // namespace

// The kernel gives the table piece by piece: while sockets come and go, one can stand in two of them. Those
// that listen come first.
bool readProcNetTcp(const std::string& path, std::vector<TcpSocket>& rows, TcpSockets which) {
    std::ifstream table(path);
    std::string line;
    if (!std::getline(table, line)) return false;  // the headings
    rows.clear();
    std::unordered_set<std::string> seen;
    while (std::getline(table, line)) {
        const Fields fields = fieldsOf(line);
        TcpSocket row;
        if (!readRow(fields, row)) continue;
        if (which == TcpSockets::Listening && row.state != kListening) break;
        const bool isConnection = row.remotePort != 0;
        if (isConnection && !seen.insert(std::string(fields[kLocal]) += fields[kRemote]).second) continue;
        rows.push_back(std::move(row));
    }
    return !table.bad();
}

}  // namespace vexa::posix
