#pragma once

#include "platform/Clock.h"

// How a simulated machine owns the time. Nothing else includes this.

namespace vexa::platform {

/// From now on machine time runs `speed` times as fast as the wall clock; 0 stops it, so that only
/// advance() moves it.
void setClockSpeed(double speed);

/// Moves the time on, deadline by deadline: whatever falls due runs until every thread waits again before the
/// next deadline comes. Returns when the whole span has been gone through; false if the threads did not come
/// to rest within 10 s of real time. The caller counts as waiting.
bool advance(Duration span);

/// As advance(), but returns at once; the time moves as soon as every thread waits. For callers on threads
/// that have work of their own to do on the way.
void requestAdvance(Duration span);

/// Moves wallTime() and localTime() alone, as a corrected clock would. No wait changes.
void shiftWallTime(Duration span);

}  // namespace vexa::platform
