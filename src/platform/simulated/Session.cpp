#include "platform/Session.h"

#include "simulation/Machine.h"

namespace vexa::platform {

bool isSessionActive() {
    const simulation::Machine* const machine = simulation::Machine::current();
    return machine != nullptr && machine->session() == simulation::SessionState::Active;
}

}  // namespace vexa::platform
