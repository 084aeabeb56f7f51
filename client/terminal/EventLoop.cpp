#include "client/terminal/EventLoop.h"

#include <algorithm>
#include <vector>

namespace vexa::client {

namespace {

/// As shells count them, on every system.
int exitCodeOf(Signal signal) {
    switch (signal) {
        case Signal::HangUp:
            return 129;
        case Signal::Interrupt:
            return 130;
        case Signal::Quit:
            return 131;
        case Signal::Terminate:
            return 143;
        default:
            return 0;
    }
}

}  // namespace

// What was found beside a signal is found again, unless it went while the process was suspended.
bool EventLoop::wait(std::span<Polled> polled, Deadline deadline) {
    std::vector<Polled> watched{{m_signals.descriptor(), kReadable},
                                {m_terminal == nullptr ? -1 : m_terminal->keyDescriptor(), kReadable}};
    watched.insert(watched.end(), polled.begin(), polled.end());
    waitFor(watched, deadline);
    const bool isSignalled = watched[0].happened != 0;
    for (std::size_t i = 0; i < polled.size(); ++i)
        polled[i].happened = isSignalled ? short{0} : watched[i + 2].happened;
    if (isSignalled) return takeSignals();
    return watched[1].happened == 0 || !m_terminal->takeQuit();
}

bool EventLoop::takeSignals() {
    while (const auto signal = m_signals.take()) {
        if (const int code = exitCodeOf(*signal); code != 0) {
            s_stopCode = code;
            return false;
        }
        if (*signal == Signal::Suspend) suspend();
        if (*signal == Signal::Resize && m_terminal != nullptr) m_terminal->resized();
    }
    return true;
}

void EventLoop::suspend() {
    if (m_terminal != nullptr) m_terminal->leave();
    Signals::suspend();
    if (m_terminal != nullptr) m_terminal->enter();
}

}  // namespace vexa::client
