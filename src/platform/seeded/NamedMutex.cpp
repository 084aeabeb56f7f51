#include "platform/NamedMutex.h"

#include <map>

#include "platform/Event.h"

namespace vexa::platform {

namespace {

struct Shared {
    bool isOwned = false;
    Event released{Reset::Auto, "a named mutex"};
};

// The seeded machine has one process; its handles share what they name.
std::map<std::string, std::weak_ptr<Shared>>& openMutexes() {
    static std::map<std::string, std::weak_ptr<Shared>> mutexes;
    return mutexes;
}

}  // namespace

struct NamedMutex::State {
    std::shared_ptr<Shared> shared;
    bool existedBefore = false;
    bool isOwned = false;
};

NamedMutex::NamedMutex(const std::string& name, Owner initialOwner) : m_state(std::make_unique<State>()) {
    std::weak_ptr<Shared>& entry = openMutexes()[name];
    m_state->shared = entry.lock();
    m_state->existedBefore = m_state->shared != nullptr;
    if (!m_state->shared) entry = m_state->shared = std::make_shared<Shared>();
    if (initialOwner == Owner::Yes && !m_state->shared->isOwned)
        m_state->isOwned = m_state->shared->isOwned = true;
}

NamedMutex::~NamedMutex() {
    release();
}

bool NamedMutex::isValid() const {
    return true;
}

bool NamedMutex::existedBefore() const {
    return m_state->existedBefore;
}

bool NamedMutex::isOwned() const {
    return m_state->isOwned;
}

void NamedMutex::wait() {
    if (m_state->isOwned) return;
    while (m_state->shared->isOwned)
        m_state->shared->released.wait();
    m_state->isOwned = m_state->shared->isOwned = true;
}

void NamedMutex::release() {
    if (!m_state->isOwned) return;
    m_state->isOwned = m_state->shared->isOwned = false;
    m_state->shared->released.set();
}

}  // namespace vexa::platform
