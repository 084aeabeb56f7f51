#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <bit>
#include <cstddef>
#include <cstring>
#include <string>
#include <vector>

#include "platform/TcpTable.h"
#include "unit/platform/LocalConnection.h"
#include "unit/platform/MachineWorld.h"

namespace vexa::platform {
namespace {

constexpr std::uint32_t kLoopback = 0x0100007F;
static_assert(std::endian::native == std::endian::little);

std::uint32_t portOf(std::uint16_t hostOrder) {
    return static_cast<std::uint32_t>((hostOrder & 0xFF) << 8 | hostOrder >> 8);
}

std::vector<TcpRow> tcpRows(bool ordered) {
    std::uint32_t size = 0;
    EXPECT_EQ(getTcpTable(nullptr, size, ordered), kErrorInsufficientBuffer);
    std::vector<std::uint32_t> memory(size / sizeof(std::uint32_t) + 1);
    auto* const table = reinterpret_cast<TcpTable*>(memory.data());
    EXPECT_EQ(getTcpTable(table, size, ordered), kNoError);
    std::vector<TcpRow> rows(table->rowCount);
    std::memcpy(rows.data(), reinterpret_cast<const std::byte*>(table) + offsetof(TcpTable, rows),
                rows.size() * sizeof(TcpRow));
    return rows;
}

TEST(TcpTable, HoldsWhoListensAndBothEndsOfAConnection) {
    const test::MachineWorld world;
    const test::LocalConnection connection;
    const std::uint32_t server = portOf(connection.serverPort());
    const std::uint32_t client = portOf(connection.clientPort());
    std::vector<std::string> found;
    for (const TcpRow& row : tcpRows(true)) {
        if (row.localAddress != kLoopback) continue;
        const std::uint32_t local = row.localPort & 0xFFFF;
        const std::uint32_t remote = row.remotePort & 0xFFFF;
        if (local == server && row.state == 2) found.emplace_back("listens");
        if (local == server && remote == client) found.push_back("server " + std::to_string(row.state));
        if (local == client && remote == server) found.push_back("client " + std::to_string(row.state));
    }
    std::sort(found.begin(), found.end());
    EXPECT_EQ(found, (std::vector<std::string>{"client 5", "listens", "server 5"}));
}

TEST(TcpTable, ATableThatGrowsMeanwhileStillFits) {
    const test::MachineWorld world;
    std::uint32_t size = 0;
    ASSERT_EQ(getTcpTable(nullptr, size, true), kErrorInsufficientBuffer);
    const std::array<test::LocalConnection, 3> connections;
    std::vector<std::uint32_t> memory(size / sizeof(std::uint32_t) + 1);
    EXPECT_EQ(getTcpTable(reinterpret_cast<TcpTable*>(memory.data()), size, true), kNoError);
}

TEST(TcpTable, TooLittleMemoryIsToldWithWhatItTakes) {
    const test::MachineWorld world;
    const test::LocalConnection connection;
    TcpTable table{};
    std::uint32_t size = sizeof table;
    EXPECT_EQ(getTcpTable(&table, size, false), kErrorInsufficientBuffer);
    EXPECT_GE(size, offsetof(TcpTable, rows) + 3 * sizeof(TcpRow));
}

}  // namespace
}  // namespace vexa::platform
