#include "base/TimeValue.h"

#include <chrono>
#include <cstdio>

#include "platform/Clock.h"

namespace vexa {

namespace {

constexpr std::int64_t kMicrosecondsPerSecond = 1000000;

std::int64_t microsecondsOf(const TimeValue& t) {
    return t.seconds * kMicrosecondsPerSecond + t.microseconds;
}

}  // namespace

TimeValue getTimeValue() {
    const std::int64_t now = platform::wallTime().count();
    return {static_cast<std::int32_t>(now / kMicrosecondsPerSecond),
            static_cast<std::int32_t>(now % kMicrosecondsPerSecond)};
}

std::uint32_t millisecondsSince(const TimeValue& t) {
    const std::int64_t passed = platform::wallTime().count() - microsecondsOf(t);
    return passed < 0 ? 0 : static_cast<std::uint32_t>(passed / 1000);
}

std::string formatTimeValue(const TimeValue& t) {
    const std::chrono::sys_seconds moment{std::chrono::seconds(t.seconds)};
    const auto day = std::chrono::floor<std::chrono::days>(moment);
    const std::chrono::year_month_day date(day);
    const std::chrono::hh_mm_ss time(moment - day);
    char text[32];
    std::snprintf(text, sizeof text, "%02u/%02u %02d:%02d:%02d  ", static_cast<unsigned>(date.month()),
                  static_cast<unsigned>(date.day()), static_cast<int>(time.hours().count()),
                  static_cast<int>(time.minutes().count()), static_cast<int>(time.seconds().count()));
    return text;
}

}  // namespace vexa
