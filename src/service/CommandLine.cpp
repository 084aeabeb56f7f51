#include "service/CommandLine.h"

#include <algorithm>
#include <cstddef>
#include <new>
#include <span>
#include <string_view>
#include <vector>

#include "base/DiagnosticLog.h"
#include "base/StandardOutput.h"
#include "platform/TcpTable.h"
#include "text/TextConversion.h"

namespace vexa {

namespace {

using platform::TcpRow;
using platform::TcpTable;

constexpr std::size_t kMaxToken = 31;
// On a busy host the table grows between the question for its size and the one for its rows.
constexpr int kMaxTries = 10;

/// Storage for a table whose size only the operating system knows.
class TcpTableBuffer {
public:
    bool allocate(std::uint32_t size) {
        try {
            m_words.assign((size + sizeof(std::uint32_t) - 1) / sizeof(std::uint32_t), 0);
            return true;
        } catch (const std::bad_alloc&) {
            printToStandardOutput("Error allocating memory\n");
            return false;
        }
    }

    TcpTable* table() { return reinterpret_cast<TcpTable*>(m_words.data()); }
    std::span<const TcpRow> rows() { return {table()->rows, table()->rowCount}; }

private:
    std::vector<std::uint32_t> m_words;
};

std::uint16_t hostOrder(std::uint32_t networkPort) {
    return static_cast<std::uint16_t>((networkPort & 0xFF) << 8 | (networkPort >> 8 & 0xFF));
}

bool readTcpTable(TcpTableBuffer& buffer) {
    std::uint32_t size = sizeof(TcpTable);
    if (!buffer.allocate(size)) return false;
    const std::uint32_t guess = platform::getTcpTable(buffer.table(), size, true);
    const bool isTooSmall = guess == platform::kErrorInsufficientBuffer;
    if (isTooSmall && !buffer.allocate(size)) return false;
    std::uint32_t result = platform::getTcpTable(buffer.table(), size, true);
    const bool mayHaveGrown = isTooSmall || guess == platform::kNoError;
    for (int i = 1; mayHaveGrown && i < kMaxTries && result == platform::kErrorInsufficientBuffer; ++i) {
        if (!buffer.allocate(size)) return false;
        result = platform::getTcpTable(buffer.table(), size, true);
    }
    if (result == platform::kNoError) return true;
    printToStandardOutput("\tGetTcpTable failed with %d\n", static_cast<int>(result));
    return false;
}

bool isUsable(std::uint32_t port) {
    bool isFree = false;
    return isTcpPortFree(isFree, static_cast<std::uint16_t>(port & 0xFFFF)) && isFree;
}

}  // namespace

bool isTcpPortFree(bool& isFree, std::uint16_t port) {
    isFree = false;
    TcpTableBuffer buffer;
    if (!readTcpTable(buffer)) return false;
    const auto rows = buffer.rows();
    isFree = std::none_of(rows.begin(), rows.end(),
                          [port](const TcpRow& row) { return hostOrder(row.localPort) == port; });
    return true;
}

bool parseCommandLine(std::wstring& commandLine, std::uint32_t& saPort, std::uint32_t& hs20Port) {
    Log(4, "Checking command line arguments: %s", narrowFromWide(commandLine).c_str());
    saPort = hs20Port = 0;
    const std::size_t blank = commandLine.find(L' ');
    if (blank == std::wstring::npos) return false;
    const std::wstring second = commandLine.substr(blank + 1);
    commandLine.resize(blank);
    if (commandLine.empty() || commandLine.size() > kMaxToken || second.size() > kMaxToken) return false;

    const auto sa = static_cast<std::uint32_t>(leadingInteger(commandLine));
    const auto hs20 = static_cast<std::uint32_t>(leadingInteger(second));
    if (sa == 0 || hs20 == 0 || !isUsable(sa) || !isUsable(hs20)) return false;
    saPort = sa;
    hs20Port = hs20;
    return true;
}

}  // namespace vexa
