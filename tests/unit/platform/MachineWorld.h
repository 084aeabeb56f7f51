#pragma once

#include <memory>
#include <string>
#include <vector>

namespace vexa::test {

/// The machine under the contracts of the platform's headers, and what a test can't ask of it through them.
class MachineWorld {
public:
    MachineWorld();
    ~MachineWorld();
    MachineWorld(const MachineWorld&) = delete;
    MachineWorld& operator=(const MachineWorld&) = delete;

    /// A folder for the test alone, in the machine's own words and without a backslash at its end; empty at
    /// first.
    std::wstring folder() const;

    /// What a debugger has been told by this thread since the construction.
    std::vector<std::string> debugLines();

private:
    struct State;
    std::unique_ptr<State> m_state;
};

}  // namespace vexa::test
