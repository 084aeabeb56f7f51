#pragma once

#include <tuple>
#include <utility>

#include "text/OutOfMemory.h"

namespace vexa {

/// Runs a callable on every way out of a scope, as far as memory allows.
template <class OnExit>
class ScopeGuard {
public:
    explicit ScopeGuard(OnExit onExit) : m_onExit(std::move(onExit)) {}
    ~ScopeGuard() { std::ignore = withinMemory(m_onExit); }
    ScopeGuard(const ScopeGuard&) = delete;
    ScopeGuard& operator=(const ScopeGuard&) = delete;

private:
    const OnExit m_onExit;
};

}  // namespace vexa
