#include "platform/Thread.h"

#include <system_error>
#include <thread>
#include <utility>

#include "platform/Event.h"
#include "platform/running/Scheduler.h"

namespace vexa::platform {

struct Thread::State {
    std::thread thread = {};
    Event ended{Reset::Manual};
};

Thread::~Thread() {
    if (m_state && m_state->thread.joinable()) join();
}

bool Thread::start(std::string /*name*/, std::function<void()> body) {
    auto state = std::make_shared<State>();
    Scheduler::get().beginWork();
    try {
        state->thread = std::thread([state, body = std::move(body)] {
            body();
            state->ended.set();
            Scheduler::get().endWork();
        });
    } catch (const std::system_error&) {
        Scheduler::get().endWork();
        return false;
    }
    m_state = std::move(state);
    return true;
}

bool Thread::isCurrent() const {
    return m_state && m_state->thread.get_id() == std::this_thread::get_id();
}

bool Thread::join(Timeout limit) {
    if (!m_state->ended.wait(limit)) return false;
    if (m_state->thread.joinable()) m_state->thread.join();
    return true;
}

void Thread::detach() {
    m_state->thread.detach();
    m_state.reset();
}

ForeignWait::ForeignWait() {
    Scheduler::get().endWork();
}

ForeignWait::~ForeignWait() {
    Scheduler::get().beginWork();
}

void beginForeignWork() {
    Scheduler::get().beginWork();
}

void endForeignWork() {
    Scheduler::get().endWork();
}

}  // namespace vexa::platform
