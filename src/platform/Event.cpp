#include "platform/Event.h"

namespace vexa::platform {

bool Event::wait(Timeout limit) {
    Event* const self = this;
    return waitForAny({&self, 1}, limit) == 0;
}

int waitForAny(std::span<Event* const> events, Timeout limit) {
    return waitForAnyUntil(events, limit ? Timeout(now() + *limit) : kForever);
}

}  // namespace vexa::platform
