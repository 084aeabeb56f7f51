#pragma once

#include <memory>
#include <string>

namespace vexa::platform {

/// A mutex that processes of one machine find by name. It exists while a process has it open; the death of
/// its owner releases it.
class NamedMutex {
public:
    enum class Owner { Yes, No };

    /// Creates the mutex, or opens it if it exists; `Owner::Yes` also takes it if nobody has it.
    NamedMutex(const std::string& name, Owner initialOwner);

    /// Closes it. An owner releases it first.
    ~NamedMutex();
    NamedMutex(const NamedMutex&) = delete;
    NamedMutex& operator=(const NamedMutex&) = delete;

    /// False: the operating system refused, and nothing below does anything.
    bool isValid() const;
    bool existedBefore() const;
    bool isOwned() const;

    /// Blocks until this process owns the mutex, because it was released or its owner died.
    void wait();
    void release();

private:
    struct State;
    std::unique_ptr<State> m_state;
};

}  // namespace vexa::platform
