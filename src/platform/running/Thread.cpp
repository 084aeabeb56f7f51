#include "platform/Thread.h"

#include <atomic>
#include <exception>
#include <thread>
#include <utility>

#include "platform/Event.h"
#include "platform/running/Scheduler.h"
#include "text/OutOfMemory.h"

namespace vexa::platform {

namespace {

bool waitForEnd(Event& ended, Timeout limit) {
    if (!limit) return ended.wait();
    const std::uint64_t id = Scheduler::get().beginJoin(*limit);
    const bool hasEnded = ended.wait(limit);
    Scheduler::get().endJoin(id);
    return hasEnded;
}

}  // namespace

struct Thread::State {
    std::thread thread = {};
    std::atomic<std::thread::id> id = {};
    Event ended{Reset::Manual};
};

Thread::~Thread() {
    if (m_state && m_state->thread.joinable()) join();
}

bool Thread::start(const std::string& /*name*/, std::function<void()> body) {
    if (!withinMemory([this] { m_state = std::make_shared<State>(); })) return false;
    Scheduler::get().beginWork();
    try {
        m_state->thread = std::thread([state = m_state, body = std::move(body)] {
            state->id = std::this_thread::get_id();
            body();
            state->ended.set();
            Scheduler::get().endWork();
        });
    } catch (const std::exception&) {  // no thread or no memory to be had
        Scheduler::get().endWork();
        m_state.reset();
        return false;
    }
    return true;
}

bool Thread::isCurrent() const {
    return m_state && m_state->id == std::this_thread::get_id();
}

bool Thread::join(Timeout limit) {
    if (!waitForEnd(m_state->ended, limit)) return false;
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
