#include "platform/Mutex.h"

#include <atomic>
#include <mutex>
#include <thread>

namespace vexa::platform {

struct Mutex::State {
    std::mutex mutex;
};

Mutex::Mutex(const char* /*name*/) : m_state(std::make_unique<State>()) {}

Mutex::~Mutex() = default;

void Mutex::lock() NO_THREAD_SAFETY_ANALYSIS {
    m_state->mutex.lock();
}

void Mutex::unlock() NO_THREAD_SAFETY_ANALYSIS {
    m_state->mutex.unlock();
}

struct RecursiveMutex::State {
    std::recursive_mutex mutex;
    std::atomic<std::thread::id> owner{};
    int depth = 0;
};

RecursiveMutex::RecursiveMutex(const char* /*name*/) : m_state(std::make_unique<State>()) {}

RecursiveMutex::~RecursiveMutex() = default;

void RecursiveMutex::lock() NO_THREAD_SAFETY_ANALYSIS {
    m_state->mutex.lock();
    if (m_state->depth++ == 0) m_state->owner = std::this_thread::get_id();
}

void RecursiveMutex::unlock() NO_THREAD_SAFETY_ANALYSIS {
    if (--m_state->depth == 0) m_state->owner = std::thread::id();
    m_state->mutex.unlock();
}

bool RecursiveMutex::isHeldByThisThread() const {
    return m_state->owner == std::this_thread::get_id();
}

}  // namespace vexa::platform
