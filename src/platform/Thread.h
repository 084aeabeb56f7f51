#pragma once

#include <functional>
#include <memory>
#include <string>

#include "platform/Clock.h"

namespace vexa::platform {

/// One thread of execution. The destructor joins a thread that was neither joined nor detached.
class Thread {
public:
    Thread() = default;
    ~Thread();
    Thread(Thread&&) noexcept = default;
    Thread& operator=(Thread&&) noexcept = default;

    /// Runs `body` on a new thread; `name` is for debuggers and reports. False if none could be created.
    bool start(const std::string& name, std::function<void()> body);

    bool isStarted() const { return m_state != nullptr; }
    bool isCurrent() const;

    /// Waits for the end of the thread, at most `limit`; true once it has ended. REQUIRES: started, not
    /// called on the thread itself.
    bool join(Timeout limit = kForever);

    /// Lets the thread end on its own; it must keep alive what it uses.
    void detach();

    struct State;

private:
    std::shared_ptr<State> m_state;
};

/// Around a wait that the platform does not see (a lock on a file, a socket), so that the clock knows that
/// this thread rests.
class ForeignWait {
public:
    ForeignWait();
    ~ForeignWait();
    ForeignWait(const ForeignWait&) = delete;
    ForeignWait& operator=(const ForeignWait&) = delete;
};

/// Work under way on threads that the platform did not start, so that the clock knows that the process does
/// not rest: from begin to end, whichever threads call them. Such a thread may wait for platform events in
/// between.
void beginForeignWork();
void endForeignWork();

}  // namespace vexa::platform
