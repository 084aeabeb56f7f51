#pragma once

namespace vexa::simulation {

/// While one lives, its thread runs code of the machine, or again that of the program on it. The machine has
/// memory of its own: a test that lets a program's run short spares it.
class MachineCode {
public:
    explicit MachineCode(bool isMachines = true);
    ~MachineCode();
    MachineCode(const MachineCode&) = delete;
    MachineCode& operator=(const MachineCode&) = delete;

    static bool isRunning();

private:
    const bool m_before;
};

}  // namespace vexa::simulation
