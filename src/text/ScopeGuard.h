#pragma once

#include <functional>
#include <utility>

namespace vexa {

/// Runs a callable on every way out of a scope.
class ScopeGuard {
public:
    explicit ScopeGuard(std::function<void()> onExit) : m_onExit(std::move(onExit)) {}
    ~ScopeGuard() { m_onExit(); }
    ScopeGuard(const ScopeGuard&) = delete;
    ScopeGuard& operator=(const ScopeGuard&) = delete;

private:
    const std::function<void()> m_onExit;
};

}  // namespace vexa
