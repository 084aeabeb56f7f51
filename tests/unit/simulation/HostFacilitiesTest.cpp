#include <arpa/inet.h>
#include <gtest/gtest.h>
#include <netinet/in.h>
#include <stdlib.h>
#include <sys/socket.h>
#include <unistd.h>

#include <cstddef>
#include <cstring>

#include "TestMachine.h"
#include "platform/DebugOutput.h"
#include "platform/PeerAccount.h"
#include "platform/Session.h"
#include "platform/TcpTable.h"
#include "platform/simulated/MachineFolder.h"
#include "simulation/OwnerFiles.h"

namespace vexa::simulation {
namespace {

class Socket {
public:
    explicit Socket(int number) : m_number(number) {}
    ~Socket() { ::close(m_number); }
    Socket(const Socket&) = delete;
    Socket& operator=(const Socket&) = delete;

    int number() const { return m_number; }

    std::uint16_t port() const {
        sockaddr_in address{};
        socklen_t size = sizeof address;
        EXPECT_EQ(::getsockname(m_number, reinterpret_cast<sockaddr*>(&address), &size), 0);
        return ntohs(address.sin_port);
    }

private:
    int m_number;
};

/// A server on a free port and a client that is connected to it.
struct Connection {
    Connection() {
        sockaddr_in address{};
        address.sin_family = AF_INET;
        address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
        EXPECT_EQ(::bind(server.number(), reinterpret_cast<sockaddr*>(&address), sizeof address), 0);
        EXPECT_EQ(::listen(server.number(), 1), 0);
        address.sin_port = htons(server.port());
        EXPECT_EQ(::connect(client.number(), reinterpret_cast<sockaddr*>(&address), sizeof address), 0);
    }

    Socket server{::socket(AF_INET, SOCK_STREAM, 0)};
    Socket client{::socket(AF_INET, SOCK_STREAM, 0)};
};

std::vector<platform::TcpRow> tcpRows() {
    std::uint32_t size = 0;
    EXPECT_EQ(platform::getTcpTable(nullptr, size, true), platform::kErrorInsufficientBuffer);
    Bytes memory(size);
    auto* table = reinterpret_cast<platform::TcpTable*>(memory.data());
    EXPECT_EQ(platform::getTcpTable(table, size, true), platform::kNoError);
    std::vector<platform::TcpRow> rows(table->rowCount);
    std::memcpy(rows.data(), memory.data() + offsetof(platform::TcpTable, rows),
                rows.size() * sizeof rows[0]);
    return rows;
}

TEST(TcpTable, HoldsTheHostsSocketsAsWindowsShowsThem) {
    const Connection connection;
    const std::uint32_t loopback = htonl(INADDR_LOOPBACK);
    std::string states;
    for (const auto& row : tcpRows()) {
        if (row.localAddress != loopback || row.localPort != htons(connection.server.port())) continue;
        states +=
            std::to_string(row.state) + (row.remotePort == htons(connection.client.port()) ? "c " : " ");
    }
    EXPECT_EQ(states, "2 5c ");
}

TEST(TcpTable, TooLittleMemoryIsToldBeforeAnythingIsWritten) {
    const Connection connection;
    platform::TcpTable table{77, {}};
    std::uint32_t size = sizeof table;
    EXPECT_EQ(platform::getTcpTable(&table, size, false), platform::kErrorInsufficientBuffer);
    EXPECT_GT(size, sizeof table);
    EXPECT_EQ(table.rowCount, 77U);
}

TEST(PeerAccount, KnowsOnlyConnectionsOfThisAccount) {
    const Connection connection;
    EXPECT_TRUE(platform::isPeerOfSameAccount(connection.client.port(), connection.server.port()));
    EXPECT_FALSE(platform::isPeerOfSameAccount(connection.server.port(), connection.server.port()));
    EXPECT_FALSE(platform::isPeerOfSameAccount(connection.client.port(), connection.client.port()));
}

TEST(Session, IsActiveWhenTheMachinesIs) {
    TestMachine machine("{'session': 'disconnected'}");
    EXPECT_FALSE(platform::isSessionActive());
    machine.ask("{'do': 'setSession', 'session': 'active'}");
    EXPECT_TRUE(platform::isSessionActive());
}

TEST(DebugOutput, IsOneLineForEachCall) {
    TestMachine machine;
    platform::outputDebugString(std::string_view("one"));
    platform::outputDebugString(std::string_view("two\n"));
    platform::outputDebugString(std::string_view("three\n\n"));
    platform::outputDebugString(std::wstring_view(L"caf\u00E9"));
    EXPECT_EQ(readFile(machine->folder() / "debug.log"), "one\ntwo\nthree\n\ncaf\xC3\xA9\n");
}

TEST(OwnerFiles, ReplacingLeavesNothingElseBehind) {
    const TemporaryFolder folder;
    const auto path = folder.path() / "a" / "b" / "file";
    EXPECT_TRUE(replaceFile(path, "old"));
    EXPECT_TRUE(replaceFile(path, "new"));
    EXPECT_EQ(readFile(path), "new");
    EXPECT_EQ(std::distance(std::filesystem::directory_iterator(path.parent_path()), {}), 1);
    EXPECT_EQ(std::filesystem::status(path.parent_path()).permissions(), std::filesystem::perms::owner_all);
    EXPECT_FALSE(replaceFile(path / "below a file", "x"));
}

TEST(MachineFolder, IsWhatTheEnvironmentSays) {
    ::setenv("HOME", "/home/u", 1);
    ::unsetenv("XDG_STATE_HOME");
    ::unsetenv("VEXA_MACHINE");
    EXPECT_EQ(platform::machineFolder(), "/home/u/.local/state/vexa/machine");
    ::setenv("XDG_STATE_HOME", "/state", 1);
    EXPECT_EQ(platform::machineFolder(), "/state/vexa/machine");
    ::setenv("VEXA_MACHINE", "/m", 1);
    EXPECT_EQ(platform::machineFolder(), "/m");
    ::unsetenv("VEXA_MACHINE");
}

}  // namespace
}  // namespace vexa::simulation
