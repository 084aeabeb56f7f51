#pragma once

#include <condition_variable>
#include <cstdint>
#include <functional>
#include <memory>
#include <mutex>
#include <random>
#include <span>
#include <string>
#include <thread>
#include <utility>
#include <vector>

#include "platform/Event.h"

namespace vexa::platform {

struct Event::State {
    const Reset reset;
    const char* const name;
    bool isSet = false;
};

/// One thread of the seeded world.
struct Task {
    enum class Phase { Ready, Waiting, Ended };

    Task(std::uint64_t taskId, std::string taskName) : id(taskId), name(std::move(taskName)) {}

    const std::uint64_t id;
    const std::string name;
    Phase phase = Phase::Ready;
    std::span<Event::State* const> events = {};
    const void* wantedLock = nullptr;
    const char* wantedLockName = nullptr;
    Timeout deadline = std::nullopt;
    int outcome = kTimedOut;
    bool wantsRest = false;
    std::condition_variable turn = {};
    std::thread thread = {};
};

/// Decides who runs. Exactly one task has the turn at any time; all others sleep.
class Scheduler {
public:
    static Scheduler& get();

    void run(std::uint64_t seed, std::function<void()> story);

    /// Null outside the seeded world (global objects, the test's own code before and after).
    static Task* current();

    std::shared_ptr<Task> start(std::string name, std::function<void()> body);

    /// A moment at which the seed may give the turn to another task.
    void handOver();

    int wait(std::span<Event::State* const> events, Timeout deadline);
    void set(Event::State& event);

    /// Until no other task can run at this moment.
    void waitForRest();

    /// Until somebody announces that this lock is free.
    void waitForLock(const void* lock, const char* name);
    void announceFreeLock(const void* lock);

    Duration now() const { return m_now; }

private:
    using Lock = std::unique_lock<std::mutex>;

    void runTask(const std::shared_ptr<Task>& task, const std::function<void()>& body);
    void giveTurn(Lock& lock);
    Task* chooseNext();
    std::size_t countReady() const;
    bool releaseWhoWantsRest();
    bool jumpToNextDeadline();
    void release(Task& task, int outcome);
    [[noreturn]] void reportDeadlock() const;

    std::mutex m_mutex;
    std::condition_variable m_allEnded;
    std::vector<std::shared_ptr<Task>> m_tasks;
    Task* m_turn = nullptr;
    std::uint64_t m_seed = 0;
    std::uint64_t m_nextId = 0;
    std::mt19937_64 m_random;
    Duration m_now{0};
};

}  // namespace vexa::platform
