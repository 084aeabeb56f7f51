#include "client/machine/StopSource.h"

#include <array>

#include "client/terminal/Poll.h"
#include "client/terminal/StandardInput.h"

namespace vexa::client {

StopSource::StopSource(Signals& signals, bool stopOnEndOfInput)
    : m_signals(signals), m_watchInput(stopOnEndOfInput) {}

StopSource::Wake StopSource::wait(Deadline deadline) {
    while (true) {
        if (const auto wake = takeSignals()) return *wake;
        if (deadline.isOver()) return Wake::Timeout;
        std::array<Polled, 2> watched{
            {{m_signals.descriptor(), kReadable}, {m_watchInput ? kStandardInput : -1, kReadable}}};
        waitFor(watched, deadline);
        if (watched[1].happened != 0 && inputEnded()) {
            m_watchInput = false;
            return Wake::Stop;
        }
    }
}

std::optional<StopSource::Wake> StopSource::takeSignals() {
    while (const auto signal = m_signals.take()) {
        if (Signals::isStop(*signal)) return Wake::Stop;
        if (*signal == Signal::Child) return Wake::Child;
        if (*signal == Signal::Suspend) Signals::suspend();
    }
    return std::nullopt;
}

bool StopSource::inputEnded() {
    std::array<char, 512> dropped{};
    return readStandardInput(dropped) == 0;
}

}  // namespace vexa::client
