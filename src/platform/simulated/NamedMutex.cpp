#include "platform/NamedMutex.h"

#include <fcntl.h>
#include <sys/file.h>

#include <algorithm>
#include <cerrno>
#include <filesystem>
#include <utility>

#include "platform/Thread.h"
#include "platform/posix/Descriptor.h"
#include "platform/posix/MachineFolder.h"
#include "platform/posix/OwnerFiles.h"

namespace vexa::platform {

namespace {

/// An open file whose locks other processes see. The kernel drops them with the last descriptor.
class LockFile {
public:
    explicit LockFile(const std::filesystem::path& path)
        : m_file(::open(path.c_str(), O_RDWR | O_CREAT | O_CLOEXEC, 0600)) {}

    bool isOpen() const { return static_cast<bool>(m_file); }

    /// One of the operations of flock.
    bool lock(int operation) {
        int result = 0;
        do {
            result = ::flock(m_file.get(), operation);
        } while (result != 0 && errno == EINTR);
        return result == 0;
    }

private:
    const posix::Descriptor m_file;
};

std::filesystem::path fileOf(std::string name, const char* suffix) {
    std::replace(name.begin(), name.end(), '/', '_');
    return posix::machineFolder() / "mutexes" / (name + suffix);
}

}  // namespace

// Who has `presence` locked, shared, has the mutex open; who has `ownership` locked owns it.
struct NamedMutex::State {
    explicit State(const std::string& name) : presence(fileOf(name, ".open")), ownership(fileOf(name, "")) {}

    LockFile presence;
    LockFile ownership;
    bool isValid = false;
    bool existedBefore = false;
    bool isOwned = false;
};

NamedMutex::NamedMutex(const std::string& name, Owner initialOwner) {
    posix::createOwnerFolder(posix::machineFolder() / "mutexes");
    m_state = std::make_unique<State>(name);
    State& state = *m_state;

    // Two processes that start at once must not both find that nobody has it open.
    LockFile guard(fileOf(name, ".guard"));
    if (!guard.isOpen() || !state.presence.isOpen() || !state.ownership.isOpen()) return;
    if (!guard.lock(LOCK_EX)) return;
    state.existedBefore = !state.presence.lock(LOCK_EX | LOCK_NB);
    if (!state.presence.lock(LOCK_SH)) return;
    state.isValid = true;
    state.isOwned = initialOwner == Owner::Yes && state.ownership.lock(LOCK_EX | LOCK_NB);
}

NamedMutex::~NamedMutex() = default;

bool NamedMutex::isValid() const {
    return m_state->isValid;
}

bool NamedMutex::existedBefore() const {
    return m_state->existedBefore;
}

bool NamedMutex::isOwned() const {
    return m_state->isOwned;
}

void NamedMutex::wait() {
    if (!m_state->isValid || m_state->isOwned) return;
    const ForeignWait waiting;
    m_state->isOwned = m_state->ownership.lock(LOCK_EX);
}

void NamedMutex::release() {
    if (!m_state->isOwned) return;
    m_state->isOwned = false;
    m_state->ownership.lock(LOCK_UN);
}

}  // namespace vexa::platform
