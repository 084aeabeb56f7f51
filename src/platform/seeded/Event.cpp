#include "platform/Event.h"

#include <array>
#include <cassert>

#include "platform/seeded/Scheduler.h"

namespace vexa::platform {

namespace {

constexpr std::size_t kMaxEvents = 64;

}  // namespace

Event::Event(Reset reset, const char* name) : m_state(std::make_unique<State>(State{reset, name})) {}

Event::~Event() = default;

void Event::set() {
    Scheduler::get().set(*m_state);
}

void Event::reset() {
    m_state->isSet = false;
}

int waitForAnyUntil(std::span<Event* const> events, Timeout deadline) {
    assert(events.size() <= kMaxEvents);
    std::array<Event::State*, kMaxEvents> states{};
    for (std::size_t i = 0; i < events.size(); ++i)
        states[i] = events[i]->m_state.get();
    return Scheduler::get().wait({states.data(), events.size()}, deadline);
}

}  // namespace vexa::platform
