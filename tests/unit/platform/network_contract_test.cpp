#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <bit>
#include <boost/asio/buffer.hpp>
#include <boost/asio/io_context.hpp>
#include <boost/asio/ip/tcp.hpp>
#include <boost/asio/read.hpp>
#include <boost/asio/write.hpp>
#include <cstddef>
#include <cstring>
#include <string>
#include <vector>

#include "platform/PeerAccount.h"
#include "platform/SocketLibrary.h"
#include "platform/TcpTable.h"
#include "unit/platform/MachineWorld.h"

namespace vexa::platform {
namespace {

using boost::asio::ip::tcp;

constexpr std::uint32_t kLoopback = 0x0100007F;
static_assert(std::endian::native == std::endian::little);

/// A TCP connection between two sockets of this process on 127.0.0.1, and the socket that accepted it, which
/// still listens.
class LocalConnection {
public:
    LocalConnection() {
        m_client.connect(m_acceptor.local_endpoint());
        m_acceptor.accept(m_server);
        passByte(m_client, m_server);
        passByte(m_server, m_client);
    }

    std::uint16_t serverPort() const { return m_acceptor.local_endpoint().port(); }
    std::uint16_t clientPort() const { return m_client.local_endpoint().port(); }

private:
    // Wine tells the owner of a socket only once he has used it.
    static void passByte(tcp::socket& from, tcp::socket& to) {
        char byte = 'b';
        boost::asio::write(from, boost::asio::buffer(&byte, 1));
        boost::asio::read(to, boost::asio::buffer(&byte, 1));
    }

    boost::asio::io_context m_context;
    tcp::acceptor m_acceptor{m_context, tcp::endpoint(boost::asio::ip::address_v4::loopback(), 0)};
    tcp::socket m_client{m_context};
    tcp::socket m_server{m_context};
};

TEST(SocketLibrary, StaysUntilTheLastWhoTookItHasGivenItBack) {
    constexpr std::uint16_t kVersion = 0x0202;
    ASSERT_TRUE(startSocketLibrary(kVersion));
    ASSERT_TRUE(startSocketLibrary(kVersion));
    stopSocketLibrary();
    EXPECT_NO_THROW(LocalConnection());
    stopSocketLibrary();
}

TEST(PeerAccount, KnowsOnlyConnectionsOfThisAccountWhileTheyLast) {
    std::vector<PeerPorts> asked;
    {
        const LocalConnection connection;
        const std::uint16_t client = connection.clientPort();
        const std::uint16_t server = connection.serverPort();
        // A listening socket is no end of a connection.
        asked = {{client, server}, {server, server}, {client, client}, {0, server}, {client, server}};
        EXPECT_EQ(arePeersOfSameAccount(asked), (std::vector{true, false, false, false, true}));
    }
    EXPECT_EQ(arePeersOfSameAccount(asked), std::vector<bool>(asked.size()));
}

std::vector<TcpRow> tcpRows(bool ordered) {
    std::uint32_t size = 0;
    EXPECT_EQ(getTcpTable(nullptr, size, ordered), kErrorInsufficientBuffer);
    const std::array<LocalConnection, 3> meanwhile;  // a table that grows still fits
    std::vector<std::uint32_t> memory(size / sizeof(std::uint32_t) + 1);
    auto* const table = reinterpret_cast<TcpTable*>(memory.data());
    EXPECT_EQ(getTcpTable(table, size, ordered), kNoError);
    std::vector<TcpRow> rows(table->rowCount);
    std::memcpy(rows.data(), reinterpret_cast<const std::byte*>(table) + offsetof(TcpTable, rows),
                rows.size() * sizeof(TcpRow));
    return rows;
}

std::uint32_t portOf(std::uint16_t hostOrder) {
    return static_cast<std::uint32_t>((hostOrder & 0xFF) << 8 | hostOrder >> 8);
}

TEST(TcpTable, HoldsWhoListensAndBothEndsOfAConnection) {
    const test::MachineWorld world;
    const LocalConnection connection;
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

TEST(TcpTable, TooLittleMemoryIsToldWithWhatItTakes) {
    const test::MachineWorld world;
    const LocalConnection connection;
    TcpTable table{};
    std::uint32_t size = sizeof table;
    EXPECT_EQ(getTcpTable(&table, size, false), kErrorInsufficientBuffer);
    EXPECT_GE(size, offsetof(TcpTable, rows) + 3 * sizeof(TcpRow));
}

}  // namespace
}  // namespace vexa::platform
