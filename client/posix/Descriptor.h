#pragma once

#include <unistd.h>

#include <utility>

namespace vexa::client {

/// Owns a file descriptor; -1 is none.
class Descriptor {
public:
    explicit Descriptor(int value = -1) : m_value(value) {}
    ~Descriptor() { reset(); }
    Descriptor(Descriptor&& other) noexcept : m_value(std::exchange(other.m_value, -1)) {}
    Descriptor& operator=(Descriptor&& other) noexcept {
        reset(std::exchange(other.m_value, -1));
        return *this;
    }
    Descriptor(const Descriptor&) = delete;
    Descriptor& operator=(const Descriptor&) = delete;

    int get() const { return m_value; }
    explicit operator bool() const { return m_value >= 0; }

    void reset(int value = -1) {
        if (m_value >= 0) ::close(m_value);
        m_value = value;
    }

private:
    int m_value;
};

}  // namespace vexa::client
