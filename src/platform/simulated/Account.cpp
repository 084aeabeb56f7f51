#include "platform/Account.h"

#include "simulation/Machine.h"
#include "text/TextConversion.h"

namespace vexa::platform {

std::optional<std::wstring> accountName() {
    const simulation::Machine* const machine = simulation::Machine::current();
    if (machine == nullptr || machine->scenario().user.empty()) return std::nullopt;
    return wideFromUtf8(machine->scenario().user);
}

}  // namespace vexa::platform
