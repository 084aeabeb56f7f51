#pragma once

#include <algorithm>
#include <chrono>
#include <optional>

namespace vexa::client {

/// The moment up to which something is waited for; of two the smaller one is the earlier one.
class Deadline {
public:
    using Clock = std::chrono::steady_clock;

    static Deadline never() { return Deadline(Clock::time_point::max()); }
    static Deadline in(std::chrono::milliseconds limit) { return Deadline(Clock::now() + limit); }

    bool isOver() const { return Clock::now() >= m_at; }

    /// 0 once it is over, and only then; nothing if it never will be.
    std::optional<std::chrono::milliseconds> left() const {
        if (m_at == Clock::time_point::max()) return std::nullopt;
        const auto rest = std::chrono::ceil<std::chrono::milliseconds>(m_at - Clock::now());
        return std::max(rest, std::chrono::milliseconds(0));
    }

    friend bool operator<(const Deadline& a, const Deadline& b) { return a.m_at < b.m_at; }

private:
    explicit Deadline(Clock::time_point at) : m_at(at) {}

    Clock::time_point m_at;
};

}  // namespace vexa::client
