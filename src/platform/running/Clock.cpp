#include "platform/Clock.h"

#include <atomic>
#include <limits>

#include "platform/ClockControl.h"
#include "platform/running/Scheduler.h"

namespace vexa::platform {

namespace {

std::atomic<Duration::rep> g_shift{0};

// The calendar at the machine's start, once a simulated machine owns the clock: from then on one clock tells
// both. Until then the calendar is the system's own, which may be corrected.
constexpr Duration::rep kNoMachine = std::numeric_limits<Duration::rep>::min();
std::atomic<Duration::rep> g_calendarAtStart{kNoMachine};

Duration systemCalendar() {
    return std::chrono::duration_cast<Duration>(std::chrono::system_clock::now().time_since_epoch());
}

}  // namespace

Duration now() {
    return Scheduler::get().now();
}

Duration wallTime() {
    const Duration::rep start = g_calendarAtStart;
    return Duration(g_shift.load()) + (start == kNoMachine ? systemCalendar() : Duration(start) + now());
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
    if (g_calendarAtStart == kNoMachine) g_calendarAtStart = (systemCalendar() - now()).count();
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
