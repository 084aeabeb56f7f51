#include <arpa/inet.h>
#include <gtest/gtest.h>
#include <sys/socket.h>

#include <fstream>
#include <utility>
#include <vector>

#include "client/machine/MachineFolder.h"
#include "client/machine/TcpEndpoints.h"
#include "client/machine/TcpPorts.h"
#include "client/terminal/ClientError.h"
#include "platform/posix/Descriptor.h"

namespace vexa::client {
namespace {

constexpr const char* kTable =
    "  sl  local_address rem_address   st tx_queue rx_queue tr tm->when retrnsmt   uid  timeout inode\n"
    "   0: 0100007F:1F41 00000000:0000 0A 00000000:00000000 00:00000000 00000000     0        0 111 1 0 100 "
    "0\n"
    "   1: 0200007F:1F41 00000000:0000 0A 00000000:00000000 00:00000000 00000000     0        0 112 1 0 100 "
    "0\n"
    "   2: 0100007F:1F42 0100007F:C350 06 00000000:00000000 03:00000123 00000000     0        0 0 3 0\n"
    "   3: 0100007F:C350 0100007F:1F43 01 00000000:00000000 00:00000000 00000000     0        0 113 1 0 20 "
    "4\n";

TcpPorts fromText(const std::string& text) {
    const TemporaryMachine folder;
    const auto file = folder.path() / "tcp";
    std::ofstream(file) << text;
    return TcpPorts(readTcpTable(file.string()));
}

TEST(TcpPorts, ARowOfAnyStateMakesItsLocalPortBusy) {
    const TcpPorts ports = fromText(kTable);
    EXPECT_TRUE(ports.isBusy(8001));
    EXPECT_TRUE(ports.isBusy(8002));
    EXPECT_TRUE(ports.isBusy(50000));
    EXPECT_FALSE(ports.isBusy(8003)) << "a remote port";
}

TEST(TcpPorts, ListenersAreTheSocketsThatListen) {
    const TcpPorts ports = fromText(kTable);
    EXPECT_EQ(ports.listeners(8001), (std::set<std::uint64_t>{111, 112}));
    EXPECT_TRUE(ports.listeners(8002).empty());
    EXPECT_TRUE(ports.listeners(50000).empty());
}

TEST(TcpPorts, ATableThatIsNotThereIsAnError) {
    EXPECT_THROW(readTcpTable("/nonexistent/tcp"), ClientError);
}

/// The socket, if it could be made to listen.
Descriptor listenOn(std::uint16_t port) {
    Descriptor socket(::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0));
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_port = htons(port);
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    const bool listens =
        ::bind(socket.get(), reinterpret_cast<const sockaddr*>(&address), sizeof address) == 0 &&
        ::listen(socket.get(), 1) == 0;
    return listens ? std::move(socket) : Descriptor();
}

TEST(TcpPorts, ReservedPortsDifferAndHaveNoRow) {
    const TcpPorts ports = TcpPorts::read();
    std::vector<ReservedPort> reserved;
    std::set<std::uint16_t> numbers;
    for (int i = 0; i < 50; ++i) {
        reserved.push_back(ports.reserveFree());
        EXPECT_TRUE(numbers.insert(reserved.back().port).second);
    }
    const TcpPorts after = TcpPorts::read();
    for (const std::uint16_t number : numbers)
        EXPECT_FALSE(after.isBusy(number)) << number;
}

TEST(TcpPorts, AServerCanListenOnAReservedPort) {
    const ReservedPort reserved = TcpPorts::read().reserveFree();
    const Descriptor server = listenOn(reserved.port);
    EXPECT_TRUE(server);
    EXPECT_EQ(TcpPorts::read().listeners(reserved.port).size(), 1U);
}

}  // namespace
}  // namespace vexa::client
