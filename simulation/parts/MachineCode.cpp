#include "simulation/parts/MachineCode.h"

#include <utility>

namespace vexa::simulation {

namespace {

thread_local bool t_isMachines = false;

}  // namespace

MachineCode::MachineCode(bool isMachines) : m_before(std::exchange(t_isMachines, isMachines)) {}

MachineCode::~MachineCode() {
    t_isMachines = m_before;
}

bool MachineCode::isRunning() {
    return t_isMachines;
}

}  // namespace vexa::simulation
