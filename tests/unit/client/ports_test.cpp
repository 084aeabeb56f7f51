#include <gtest/gtest.h>
#include <sys/stat.h>

#include <fstream>

#include "client/ClientError.h"
#include "client/MachineFolder.h"
#include "client/ServicePorts.h"
#include "client/TcpPorts.h"
#include "client/posix/TcpTable.h"

namespace vexa::client {
namespace {

constexpr ServicePorts kPorts{8001, 8002, 65535};

TEST(ServicePorts, TheFileIsForTheOwnerAndGivesThemBack) {
    const TemporaryMachine machine;
    const auto file = machine.path() / "ports.json";
    ASSERT_TRUE(writePortsFile(file, kPorts));
    struct stat status {};
    ASSERT_EQ(::stat(file.c_str(), &status), 0);
    EXPECT_EQ(status.st_mode & 0777, 0600U);
    const auto read = readPortsFile(file);
    ASSERT_TRUE(read);
    EXPECT_EQ(portsAsText(*read), "sa=8001 hs20=8002 control=65535");
    EXPECT_FALSE(writePortsFile(machine.path() / "none" / "ports.json", kPorts));
}

TEST(ServicePorts, AnotherFileGivesNone) {
    const TemporaryMachine machine;
    const auto file = machine.path() / "ports.json";
    EXPECT_FALSE(readPortsFile(file));
    for (const char* text : {"", "[]", R"({"sa":1,"hs20":2})", R"({"sa":1,"hs20":2,"control":65536})",
                             R"({"sa":-1,"hs20":2,"control":0})", R"({"sa":"1","hs20":2,"control":0})"}) {
        std::ofstream(file) << text;
        EXPECT_FALSE(readPortsFile(file)) << text;
    }
}

TEST(TcpPorts, ARowOfAnyStateMakesItsLocalPortBusyAndASocketThatListensIsAListener) {
    const TemporaryMachine folder;
    const auto file = folder.path() / "tcp";
    std::ofstream(file)
        << "  sl  local_address rem_address   st tx_queue rx_queue tr tm->when retrnsmt uid timeout inode\n"
           "   0: 0100007F:1F41 00000000:0000 0A 0:0 00:0 0 0 0 111 1 0 100 0\n"
           "   1: 0200007F:1F41 00000000:0000 0A 0:0 00:0 0 0 0 112 1 0 100 0\n"
           "   2: 0100007F:1F42 0100007F:C350 06 0:0 03:123 0 0 0 0 3 0\n"
           "   3: 0100007F:C350 0100007F:1F43 01 0:0 00:0 0 0 0 113 1 0 20 4\n";
    const TcpPorts ports(readTcpTable(file.string()));
    EXPECT_TRUE(ports.isBusy(8001));
    EXPECT_TRUE(ports.isBusy(8002));
    EXPECT_TRUE(ports.isBusy(50000));
    EXPECT_FALSE(ports.isBusy(8003)) << "a remote port";
    EXPECT_EQ(ports.listeners(8001), (std::set<std::uint64_t>{111, 112}));
    EXPECT_TRUE(ports.listeners(8002).empty());
    EXPECT_THROW(readTcpTable("/nonexistent/tcp"), ClientError);
}

TEST(TcpPorts, ReservedPortsDifferHaveNoRowAndAreLeftForTheirServer) {
    const TcpPorts ports = TcpPorts::read();
    std::vector<ReservedPort> reserved;
    std::set<std::uint16_t> numbers;
    for (int i = 0; i < 50; ++i) {
        reserved.push_back(ports.reserveFree());
        EXPECT_TRUE(numbers.insert(reserved.back().port).second);
    }
    const TcpPorts after = TcpPorts::read();
    for (const std::uint16_t number : numbers) {
        EXPECT_FALSE(after.isBusy(number)) << number;
        EXPECT_TRUE(canBind(number)) << number;
    }
}

}  // namespace
}  // namespace vexa::client
