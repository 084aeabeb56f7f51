#pragma once

#include <windows.h>

#include <utility>

namespace vexa::platform {

/// Owns what an operating system call gave, and gives it back by `close`. Null and INVALID_HANDLE_VALUE both
/// mean that there is nothing: which of them tells of a failure differs from call to call.
template <class Raw, auto close>
class Owned {
public:
    Owned() = default;
    explicit Owned(Raw raw) : m_raw(static_cast<void*>(raw) == INVALID_HANDLE_VALUE ? nullptr : raw) {}
    ~Owned() { reset(); }
    Owned(Owned&& other) noexcept : m_raw(std::exchange(other.m_raw, nullptr)) {}
    Owned& operator=(Owned&& other) noexcept {
        std::swap(m_raw, other.m_raw);
        return *this;
    }

    explicit operator bool() const { return m_raw != nullptr; }
    Raw get() const { return m_raw; }

    void reset() {
        if (m_raw != nullptr) close(std::exchange(m_raw, nullptr));
    }

    /// Leaves it to the caller.
    Raw release() { return std::exchange(m_raw, nullptr); }

    /// Where a call that gives its result through a pointer puts it.
    Raw* receive() {
        reset();
        return &m_raw;
    }

private:
    Raw m_raw = nullptr;
};

using Handle = Owned<HANDLE, &::CloseHandle>;

}  // namespace vexa::platform
