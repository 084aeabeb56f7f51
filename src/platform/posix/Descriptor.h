#pragma once

#include <unistd.h>

#include <cerrno>
#include <string_view>
#include <utility>

namespace vexa::posix {

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

/// Goes on after an interruption and a part, until all is written or an error stops it. How many bytes were
/// written.
inline std::size_t writeSome(const Descriptor& file, std::string_view content) {
    std::size_t done = 0;
    while (done < content.size()) {
        const ssize_t written = ::write(file.get(), content.data() + done, content.size() - done);
        if (written < 0 && errno == EINTR) continue;
        if (written <= 0) break;
        done += static_cast<std::size_t>(written);
    }
    return done;
}

/// False if an error stops it.
inline bool writeAll(const Descriptor& file, std::string_view content) {
    return writeSome(file, content) == content.size();
}

}  // namespace vexa::posix
