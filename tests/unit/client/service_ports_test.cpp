#include <gtest/gtest.h>
#include <sys/stat.h>

#include <fstream>

#include "client/machine/MachineFolder.h"
#include "client/machine/ServicePorts.h"

namespace vexa::client {
namespace {

constexpr ServicePorts kPorts{8001, 8002, 65535};

TEST(ServicePorts, ReadyLineAndJson) {
    EXPECT_EQ(portsAsText(kPorts), "sa=8001 hs20=8002 control=65535");
    EXPECT_EQ(portsAsJson({1, 2, 0}), R"({"control":0,"hs20":2,"sa":1})");
}

TEST(ServicePorts, TheFileIsForTheOwnerAndGivesThemBack) {
    const TemporaryMachine machine;
    const auto file = machine.path() / "ports.json";
    ASSERT_TRUE(writePortsFile(file, kPorts));
    struct stat status {};
    ASSERT_EQ(::stat(file.c_str(), &status), 0);
    EXPECT_EQ(status.st_mode & 0777, 0600U);
    const auto read = readPortsFile(file);
    ASSERT_TRUE(read);
    EXPECT_EQ(portsAsText(*read), portsAsText(kPorts));
}

TEST(ServicePorts, AnotherFileGivesNone) {
    const TemporaryMachine machine;
    const auto file = machine.path() / "ports.json";
    EXPECT_FALSE(readPortsFile(file));
    for (const char* text :
         {"", "nonsense", "[]", "{}", R"({"sa":1,"hs20":2})", R"({"sa":1,"hs20":2,"control":65536})",
          R"({"sa":-1,"hs20":2,"control":0})", R"({"sa":"1","hs20":2,"control":0})"}) {
        std::ofstream(file) << text;
        EXPECT_FALSE(readPortsFile(file)) << text;
    }
}

TEST(ServicePorts, AFolderThatIsNotThereTakesNoFile) {
    const TemporaryMachine machine;
    EXPECT_FALSE(writePortsFile(machine.path() / "none" / "ports.json", kPorts));
}

}  // namespace
}  // namespace vexa::client
