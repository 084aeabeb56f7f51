#include "platform/posix/ProcNetTcp.h"

#include <fstream>
#include <set>
#include <sstream>
#include <tuple>
#include <utility>

namespace vexa::posix {

namespace {

// "0100007F:1F90"
bool readEndpoint(std::istream& line, std::string& address, std::uint16_t& port) {
    std::string text;
    line >> text;
    const auto colon = text.find(':');
    if (colon == std::string::npos) return false;
    address = text.substr(0, colon);
    std::istringstream digits(text.substr(colon + 1));
    return static_cast<bool>(digits >> std::hex >> port);
}

// slot, local, remote, state, queues, timer, retransmissions, uid, timeout, inode, and more
bool readRow(const std::string& text, TcpSocket& row) {
    std::istringstream line(text);
    std::string skipped;
    line >> skipped;
    if (!readEndpoint(line, row.localAddress, row.localPort)) return false;
    if (!readEndpoint(line, row.remoteAddress, row.remotePort)) return false;
    line >> std::hex >> row.state >> skipped >> skipped >> skipped >> std::dec >> row.uid >> skipped >>
        row.inode;
    return static_cast<bool>(line);
}

using Connection = std::tuple<std::string, std::uint16_t, std::string, std::uint16_t>;

Connection connectionOf(const TcpSocket& row) {
    return {row.localAddress, row.localPort, row.remoteAddress, row.remotePort};
}

}  // namespace

// The kernel gives the table piece by piece: while sockets come and go, one can stand in two of them.
bool readProcNetTcp(const std::string& path, std::vector<TcpSocket>& rows) {
    std::ifstream table(path);
    std::string line;
    if (!std::getline(table, line)) return false;  // the headings
    rows.clear();
    std::set<Connection> seen;
    while (std::getline(table, line)) {
        TcpSocket row;
        if (!readRow(line, row)) continue;
        const bool isConnection = row.remotePort != 0;
        if (isConnection && !seen.insert(connectionOf(row)).second) continue;
        rows.push_back(std::move(row));
    }
    return !table.bad();
}

}  // namespace vexa::posix
