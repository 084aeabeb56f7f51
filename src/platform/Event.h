#pragma once

#include <memory>
#include <span>

#include "platform/Clock.h"

namespace vexa::platform {

enum class Reset { Auto, Manual };

/// A flag that threads can wait for. Auto: a wait that it ends takes the flag down; Manual: it stays up until
/// reset(). Any thread may call anything at any time. Starts unset.
class Event {
public:
    /// The name shows in reports of threads that wait for ever; it must outlive the event.
    explicit Event(Reset reset, const char* name = "an event");
    ~Event();
    Event(const Event&) = delete;
    Event& operator=(const Event&) = delete;

    void set();
    void reset();

    /// True if the event was set, false at the end of the time limit.
    bool wait(Timeout limit = kForever);

    struct State;

private:
    friend int waitForAnyUntil(std::span<Event* const> events, Timeout deadline);
    std::unique_ptr<State> m_state;
};

inline constexpr int kTimedOut = -1;

/// Waits until one of the events is set and gives its index, the lowest if several are; kTimedOut at the end
/// of the time limit.
int waitForAny(std::span<Event* const> events, Timeout limit);

/// The same with an absolute deadline on the scale of now().
int waitForAnyUntil(std::span<Event* const> events, Timeout deadline);

}  // namespace vexa::platform
