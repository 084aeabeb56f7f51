#pragma once

#include <memory>

#include "platform/ThreadAnnotations.h"

namespace vexa::platform {

/// Mutual exclusion between threads. Not re-entrant: locking it twice on one thread is an error.
class CAPABILITY("mutex") Mutex {
public:
    /// The name shows in reports of threads that wait for ever; it must outlive the mutex.
    explicit Mutex(const char* name = "a mutex");
    ~Mutex();
    Mutex(const Mutex&) = delete;
    Mutex& operator=(const Mutex&) = delete;

    void lock() ACQUIRE();
    void unlock() RELEASE();

private:
    struct State;
    std::unique_ptr<State> m_state;
};

/// The same, re-entrant: a thread that holds it may take it again and must release it as often.
class CAPABILITY("mutex") RecursiveMutex {
public:
    explicit RecursiveMutex(const char* name = "a recursive mutex");
    ~RecursiveMutex();
    RecursiveMutex(const RecursiveMutex&) = delete;
    RecursiveMutex& operator=(const RecursiveMutex&) = delete;

    void lock() ACQUIRE();
    void unlock() RELEASE();

    /// For assertions: whoever waits for another thread must not hold a lock which that thread may want.
    bool isHeldByThisThread() const;

private:
    struct State;
    std::unique_ptr<State> m_state;
};

/// Holds a lock from construction to the end of the scope.
template <class Lockable>
class SCOPED_CAPABILITY LockGuard {
public:
    explicit LockGuard(Lockable& lockable) ACQUIRE(lockable) : m_lockable(lockable) { m_lockable.lock(); }
    ~LockGuard() RELEASE() { m_lockable.unlock(); }
    LockGuard(const LockGuard&) = delete;
    LockGuard& operator=(const LockGuard&) = delete;

private:
    Lockable& m_lockable;
};

}  // namespace vexa::platform
