#include "platform/NamedMutex.h"

#include "platform/Thread.h"
#include "platform/windows/Handle.h"

namespace vexa::platform {

namespace {

// An owner that died leaves the mutex abandoned, which is as good as released.
bool isTaken(DWORD outcome) {
    return outcome == WAIT_OBJECT_0 || outcome == WAIT_ABANDONED;
}

}  // namespace

struct NamedMutex::State {
    Handle handle;
    bool existedBefore = false;
    bool isOwned = false;
};

// Of a mutex that exists, creation never gives the ownership: it has to be asked for.
NamedMutex::NamedMutex(const std::string& name, Owner initialOwner) : m_state(std::make_unique<State>()) {
    const bool isWanted = initialOwner == Owner::Yes;
    m_state->handle = Handle(CreateMutexA(nullptr, isWanted ? TRUE : FALSE, name.c_str()));
    if (!m_state->handle) return;
    m_state->existedBefore = GetLastError() == ERROR_ALREADY_EXISTS;
    m_state->isOwned =
        isWanted && (!m_state->existedBefore || isTaken(WaitForSingleObject(m_state->handle.get(), 0)));
}

NamedMutex::~NamedMutex() {
    release();
}

bool NamedMutex::isValid() const {
    return static_cast<bool>(m_state->handle);
}

bool NamedMutex::existedBefore() const {
    return m_state->existedBefore;
}

bool NamedMutex::isOwned() const {
    return m_state->isOwned;
}

void NamedMutex::wait() {
    if (!m_state->handle || m_state->isOwned) return;
    const ForeignWait waiting;
    m_state->isOwned = isTaken(WaitForSingleObject(m_state->handle.get(), INFINITE));
}

void NamedMutex::release() {
    if (!m_state->isOwned) return;
    m_state->isOwned = false;
    ReleaseMutex(m_state->handle.get());
}

}  // namespace vexa::platform
