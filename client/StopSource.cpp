#include "client/StopSource.h"

#include <poll.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>

namespace vexa::client {

using std::chrono::milliseconds;
using std::chrono::steady_clock;

StopSource::StopSource(Signals& signals, bool stopOnEndOfInput)
    : m_signals(signals), m_watchInput(stopOnEndOfInput) {}

StopSource::Wake StopSource::wait(std::optional<milliseconds> limit) {
    const auto deadline = steady_clock::now() + limit.value_or(milliseconds(0));
    while (true) {
        if (const auto wake = takeSignals()) return *wake;
        int timeout = -1;
        if (limit) {
            const auto left = std::chrono::ceil<milliseconds>(deadline - steady_clock::now());
            if (left <= milliseconds(0)) return Wake::Timeout;
            timeout = static_cast<int>(left.count());
        }
        std::array<pollfd, 2> watched{
            {{m_signals.descriptor(), POLLIN, 0}, {m_watchInput ? STDIN_FILENO : -1, POLLIN, 0}}};
        if (::poll(watched.data(), watched.size(), timeout) < 0) continue;
        if (watched[1].revents != 0 && inputEnded()) {
            m_watchInput = false;
            return Wake::Stop;
        }
    }
}

std::optional<StopSource::Wake> StopSource::takeSignals() {
    while (const auto signal = m_signals.take()) {
        if (Signals::isStop(*signal)) return Wake::Stop;
        if (*signal == SIGCHLD) return Wake::Child;
        if (*signal == SIGTSTP) Signals::suspend();
    }
    return std::nullopt;
}

bool StopSource::inputEnded() {
    std::array<char, 512> dropped{};
    const ssize_t count = ::read(STDIN_FILENO, dropped.data(), dropped.size());
    return count == 0 || (count < 0 && errno != EINTR && errno != EAGAIN);
}

}  // namespace vexa::client
