#include "platform/Mutex.h"

#include "platform/seeded/Scheduler.h"

namespace vexa::platform {

namespace {

// Only the task that has the turn touches this, so it needs no lock of its own. Code outside the seeded world
// is alone and needs no lock at all.
struct Ownership {
    const char* name;
    Task* owner = nullptr;
    int depth = 0;

    void take() {
        Task* const self = Scheduler::current();
        if (self == nullptr) return;
        Scheduler& scheduler = Scheduler::get();
        scheduler.handOver();
        while (owner != nullptr)
            scheduler.waitForLock(this, name);
        owner = self;
        depth = 1;
    }

    void takeAgain() {
        if (owner != nullptr && owner == Scheduler::current())
            ++depth;
        else
            take();
    }

    void release() {
        if (Scheduler::current() == nullptr || --depth > 0) return;
        owner = nullptr;
        Scheduler& scheduler = Scheduler::get();
        scheduler.announceFreeLock(this);
        scheduler.handOver();
    }
};

}  // namespace

struct Mutex::State : Ownership {};

Mutex::Mutex(const char* name) : m_state(std::make_unique<State>(State{{name}})) {}

Mutex::~Mutex() = default;

void Mutex::lock() NO_THREAD_SAFETY_ANALYSIS {
    m_state->take();
}

void Mutex::unlock() NO_THREAD_SAFETY_ANALYSIS {
    m_state->release();
}

struct RecursiveMutex::State : Ownership {};

RecursiveMutex::RecursiveMutex(const char* name) : m_state(std::make_unique<State>(State{{name}})) {}

RecursiveMutex::~RecursiveMutex() = default;

void RecursiveMutex::lock() NO_THREAD_SAFETY_ANALYSIS {
    m_state->takeAgain();
}

void RecursiveMutex::unlock() NO_THREAD_SAFETY_ANALYSIS {
    m_state->release();
}

bool RecursiveMutex::isHeldByThisThread() const {
    return m_state->owner != nullptr && m_state->owner == Scheduler::current();
}

}  // namespace vexa::platform
