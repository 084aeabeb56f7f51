#include "platform/Clock.h"

#include "platform/ClockControl.h"
#include "platform/seeded/Scheduler.h"

namespace vexa::platform {

namespace {

constexpr Duration kEpoch = std::chrono::seconds(1767600000);

Duration g_shift{0};

}  // namespace

Duration now() {
    return Scheduler::get().now();
}

Duration wallTime() {
    return kEpoch + now() + g_shift;
}

std::tm localTime() {
    const auto seconds =
        static_cast<std::time_t>(std::chrono::duration_cast<std::chrono::seconds>(wallTime()).count());
    std::tm utc{};
    gmtime_r(&seconds, &utc);
    return utc;
}

void sleepFor(Duration duration) {
    waitForAny({}, duration);
}

// Time belongs to the seed: it jumps by itself when all threads wait.
void setClockSpeed(double /*speed*/) {}

bool advance(Duration span) {
    sleepFor(span);
    Scheduler::get().waitForRest();
    return true;
}

void requestAdvance(Duration /*span*/) {}

void shiftWallTime(Duration span) {
    g_shift += span;
}

}  // namespace vexa::platform
