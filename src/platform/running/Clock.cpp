#include "platform/Clock.h"

#include <atomic>

#include "platform/ClockControl.h"
#include "platform/running/Scheduler.h"

namespace vexa::platform {

namespace {

std::atomic<Duration::rep> g_shift{0};

}  // namespace

Duration now() {
    return Scheduler::get().now();
}

Duration wallTime() {
    const auto real = std::chrono::system_clock::now().time_since_epoch();
    return std::chrono::duration_cast<Duration>(real) + Scheduler::get().leadOverWallClock() +
           Duration(g_shift.load());
}

std::tm localTime() {
    const auto seconds =
        static_cast<std::time_t>(std::chrono::duration_cast<std::chrono::seconds>(wallTime()).count());
    std::tm local{};
#if defined(_WIN32)
    localtime_s(&local, &seconds);
#else
    localtime_r(&seconds, &local);
#endif
    return local;
}

void sleepFor(Duration duration) {
    waitForAny({}, duration);
}

void setClockSpeed(double speed) {
    Scheduler::get().setSpeed(speed);
}

bool advance(Duration span) {
    return Scheduler::get().advance(span);
}

void requestAdvance(Duration span) {
    Scheduler::get().requestAdvance(span);
}

void shiftWallTime(Duration span) {
    g_shift += span.count();
}

}  // namespace vexa::platform
