#include "platform/Thread.h"

#include <utility>

#include "platform/seeded/Scheduler.h"
#include "text/OutOfMemory.h"

namespace vexa::platform {

struct Thread::State {
    std::shared_ptr<Task> task = nullptr;
    Event ended{Reset::Manual, "the end of a thread"};
    bool isJoined = false;
};

Thread::~Thread() {
    if (m_state && !m_state->isJoined) join();
}

bool Thread::start(const std::string& name, std::function<void()> body) {
    const bool isStarted = withinMemory([&] {
        m_state = std::make_shared<State>();
        m_state->task = Scheduler::get().start(name, [state = m_state, body = std::move(body)] {
            body();
            state->ended.set();
        });
    });
    if (!isStarted) m_state.reset();
    Scheduler::get().handOver();
    return isStarted;
}

bool Thread::isCurrent() const {
    return m_state && m_state->task.get() == Scheduler::current();
}

bool Thread::join(Timeout limit) {
    m_state->isJoined = m_state->ended.wait(limit);
    return m_state->isJoined;
}

void Thread::detach() {
    m_state.reset();
}

// Every thread of the seeded world is known to its scheduler.
ForeignWait::ForeignWait() = default;
ForeignWait::~ForeignWait() {}  // Not trivial in the header: threads that run have something to say here.
void beginForeignWork() {}
void endForeignWork() {}

}  // namespace vexa::platform
