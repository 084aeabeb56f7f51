#include "platform/ClockControl.h"
#include "unit/platform/World.h"

namespace vexa::test {

void inWorld(const std::function<void()>& body) {
    platform::setClockSpeed(0);
    body();
}

}  // namespace vexa::test
