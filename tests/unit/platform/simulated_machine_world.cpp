#include <gtest/gtest.h>

#include <sstream>

#include "platform/Files.h"
#include "platform/KnownFolders.h"
#include "platform/posix/OwnerFiles.h"
#include "text/TextConversion.h"
#include "unit/platform/MachineWorld.h"
#include "unit/simulation/TestMachine.h"

namespace vexa::test {

struct MachineWorld::State {
    simulation::TestMachine machine;
    std::wstring folder;
};

MachineWorld::MachineWorld() : m_state(std::make_unique<State>()) {
    m_state->folder = platform::publicFolder().value() + L"\\contract";
    EXPECT_TRUE(platform::createFolder(m_state->folder));
}

MachineWorld::~MachineWorld() = default;

std::wstring MachineWorld::folder() const {
    return m_state->folder;
}

std::vector<std::string> MachineWorld::debugLines() {
    std::istringstream log(posix::readFile(m_state->machine->folder() / "debug.log").value_or(""));
    std::vector<std::string> lines;
    for (std::string line; std::getline(log, line);)
        lines.push_back(line);
    return lines;
}

}  // namespace vexa::test
