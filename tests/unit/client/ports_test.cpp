#include <gtest/gtest.h>

#include <fstream>

#include "client/machine/MachineFolder.h"
#include "client/machine/ServicePorts.h"
#include "client/machine/TcpEndpoints.h"
#include "client/machine/TcpPorts.h"

namespace vexa::client {
namespace {

TEST(ServicePorts, AnotherFileGivesNone) {
    const TemporaryMachine machine;
    const auto file = machine.path() / "ports.json";
    EXPECT_FALSE(readPortsFile(file));
    for (const char* text : {"", "[]", R"({"sa":1,"hs20":2})", R"({"sa":1,"hs20":2,"control":65536})",
                             R"({"sa":-1,"hs20":2,"control":0})", R"({"sa":"1","hs20":2,"control":0})"}) {
        std::ofstream(file) << text;
        EXPECT_FALSE(readPortsFile(file)) << text;
    }
    EXPECT_FALSE(writePortsFile(machine.path() / "none" / "ports.json", {}));
}

TEST(TcpPorts, ARowOfAnyStateMakesItsLocalPortBusyAndASocketThatListensIsAListener) {
    const TcpPorts ports({{8001, true, 111}, {8001, true, 112}, {8002, false, 0}, {50000, false, 113}});
    EXPECT_TRUE(ports.isBusy(8001));
    EXPECT_TRUE(ports.isBusy(8002));
    EXPECT_TRUE(ports.isBusy(50000));
    EXPECT_FALSE(ports.isBusy(8003));
    EXPECT_EQ(ports.listeners(8001), (std::set<std::uint64_t>{111, 112}));
    EXPECT_TRUE(ports.listeners(8002).empty());
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
