#pragma once

#include <cstdint>
#include <string>

namespace vexa {

/// A point in time: seconds since 1970-01-01 00:00 UTC and microseconds within the second.
struct TimeValue {
    std::int32_t seconds = 0;
    std::int32_t microseconds = 0;
};

TimeValue getTimeValue();

/// Whole milliseconds from `t` until now; 0 if it lies in the future.
std::uint32_t millisecondsSince(const TimeValue& t);

/// "MM/DD hh:mm:ss  " in UTC.
std::string formatTimeValue(const TimeValue& t);

}  // namespace vexa
