#include "platform/seeded/Scheduler.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <utility>

#include "platform/seeded/Seeded.h"

namespace vexa::platform {

namespace {

thread_local Task* t_current = nullptr;

// How often, out of 256, an operation that could go on hands the turn to somebody else.
constexpr std::uint64_t kHandOverOdds = 40;

bool isReady(const std::shared_ptr<Task>& task) {
    return task->phase == Task::Phase::Ready;
}

std::string describeWait(const Task& task) {
    std::string text;
    for (const Event::State* event : task.events)
        text += (text.empty() ? "" : " or ") + std::string(event->name);
    if (task.wantedLockName != nullptr) text = task.wantedLockName;
    return text.empty() ? "nothing" : text;
}

}  // namespace

void runSeeded(std::uint64_t seed, std::function<void()> story) {
    Scheduler::get().run(seed, std::move(story));
}

Scheduler& Scheduler::get() {
    static Scheduler scheduler;
    return scheduler;
}

Task* Scheduler::current() {
    return t_current;
}

void Scheduler::run(std::uint64_t seed, std::function<void()> story) {
    m_seed = seed;
    m_random.seed(seed);
    m_now = Duration(0);
    m_nextId = 0;
    start("story", std::move(story));
    Lock lock(m_mutex);
    giveTurn(lock);
    m_allEnded.wait(lock, [this] { return m_turn == nullptr; });
    for (const auto& task : m_tasks)
        if (task->thread.joinable()) task->thread.join();
    m_tasks.clear();
}

std::shared_ptr<Task> Scheduler::start(std::string name, std::function<void()> body) {
    auto task = std::make_shared<Task>(m_nextId++, std::move(name));
    {
        const Lock lock(m_mutex);
        m_tasks.reserve(m_tasks.size() + 1);
    }
    task->thread = std::thread([this, task, body = std::move(body)] { runTask(task, body); });
    const Lock lock(m_mutex);
    m_tasks.push_back(task);
    return task;
}

void Scheduler::runTask(const std::shared_ptr<Task>& task, const std::function<void()>& body) {
    t_current = task.get();
    {
        Lock lock(m_mutex);
        task->turn.wait(lock, [&] { return m_turn == task.get(); });
    }
    body();
    Lock lock(m_mutex);
    task->phase = Task::Phase::Ended;
    giveTurn(lock);
}

void Scheduler::handOver() {
    if (t_current == nullptr) return;
    Lock lock(m_mutex);
    if (m_random() % 256 < kHandOverOdds) giveTurn(lock);
}

// Returns when the calling task has the turn again; at once if it has ended or is no task.
void Scheduler::giveTurn(Lock& lock) {
    Task* const self = t_current;
    m_turn = chooseNext();
    if (m_turn == nullptr)
        m_allEnded.notify_all();
    else
        m_turn->turn.notify_one();
    if (self == nullptr || self->phase == Task::Phase::Ended) return;
    self->turn.wait(lock, [&] { return m_turn == self; });
}

// Without memory of its own, so that a test can let that of the running task run short.
Task* Scheduler::chooseNext() {
    std::size_t ready = countReady();
    for (; ready == 0; ready = countReady()) {
        const bool allEnded = std::all_of(m_tasks.begin(), m_tasks.end(),
                                          [](const auto& task) { return task->phase == Task::Phase::Ended; });
        if (allEnded) return nullptr;
        if (!releaseWhoWantsRest() && !jumpToNextDeadline()) reportDeadlock();
    }
    auto left = m_random() % ready;
    return std::find_if(m_tasks.begin(), m_tasks.end(),
                        [&](const auto& task) { return isReady(task) && left-- == 0; })
        ->get();
}

std::size_t Scheduler::countReady() const {
    return static_cast<std::size_t>(std::count_if(m_tasks.begin(), m_tasks.end(), isReady));
}

bool Scheduler::releaseWhoWantsRest() {
    const auto found = std::find_if(m_tasks.begin(), m_tasks.end(), [](const auto& task) {
        return task->phase == Task::Phase::Waiting && task->wantsRest;
    });
    if (found == m_tasks.end()) return false;
    release(**found, kTimedOut);
    return true;
}

bool Scheduler::jumpToNextDeadline() {
    Timeout next;
    for (const auto& task : m_tasks)
        if (task->phase == Task::Phase::Waiting && task->deadline && (!next || *task->deadline < *next))
            next = task->deadline;
    if (!next) return false;
    m_now = std::max(m_now, *next);
    for (const auto& task : m_tasks)
        if (task->phase == Task::Phase::Waiting && task->deadline && *task->deadline <= m_now)
            release(*task, kTimedOut);
    return true;
}

void Scheduler::release(Task& task, int outcome) {
    task.phase = Task::Phase::Ready;
    task.events = {};
    task.deadline = std::nullopt;
    task.wantedLock = nullptr;
    task.wantedLockName = nullptr;
    task.wantsRest = false;
    task.outcome = outcome;
}

int Scheduler::wait(std::span<Event::State* const> events, Timeout deadline) {
    handOver();
    Lock lock(m_mutex);
    for (std::size_t i = 0; i < events.size(); ++i) {
        if (!events[i]->isSet) continue;
        if (events[i]->reset == Reset::Auto) events[i]->isSet = false;
        return static_cast<int>(i);
    }
    if (deadline && *deadline <= m_now) return kTimedOut;
    t_current->phase = Task::Phase::Waiting;
    t_current->events = events;
    t_current->deadline = deadline;
    giveTurn(lock);
    return t_current->outcome;
}

void Scheduler::set(Event::State& event) {
    {
        const Lock lock(m_mutex);
        event.isSet = true;
        for (const auto& task : m_tasks) {
            const auto found = std::find(task->events.begin(), task->events.end(), &event);
            if (task->phase != Task::Phase::Waiting || found == task->events.end()) continue;
            release(*task, static_cast<int>(found - task->events.begin()));
            if (event.reset == Reset::Manual) continue;
            event.isSet = false;
            break;
        }
    }
    handOver();
}

void Scheduler::waitForRest() {
    Lock lock(m_mutex);
    t_current->phase = Task::Phase::Waiting;
    t_current->wantsRest = true;
    giveTurn(lock);
}

void Scheduler::waitForLock(const void* wanted, const char* name) {
    Lock lock(m_mutex);
    t_current->phase = Task::Phase::Waiting;
    t_current->wantedLock = wanted;
    t_current->wantedLockName = name;
    giveTurn(lock);
}

void Scheduler::announceFreeLock(const void* freed) {
    {
        const Lock lock(m_mutex);
        for (const auto& task : m_tasks)
            if (task->phase == Task::Phase::Waiting && task->wantedLock == freed) release(*task, kTimedOut);
    }
    handOver();
}

void Scheduler::reportDeadlock() const {
    std::fprintf(stderr, "Deadlock with seed %llu at %lld us:\n", static_cast<unsigned long long>(m_seed),
                 static_cast<long long>(m_now.count()));
    for (const auto& task : m_tasks)
        if (task->phase == Task::Phase::Waiting)
            std::fprintf(stderr, "  %s waits for %s\n", task->name.c_str(), describeWait(*task).c_str());
    std::fflush(stderr);
    std::abort();
}

}  // namespace vexa::platform
