#include "client/machine/StopSource.h"

#include <array>

#include "client/terminal/StandardInput.h"

namespace vexa::client {

namespace {

bool inputEnded() {
    std::array<char, 512> dropped{};
    return readStandardInput(dropped) == 0;
}

}  // namespace

StopSource::StopSource(Signals& signals, bool stopOnEndOfInput)
    : m_loop(signals), m_watchInput(stopOnEndOfInput) {}

bool StopSource::wait(Deadline deadline) {
    Polled input{m_watchInput ? kStandardInput : -1, kReadable};
    if (!m_loop.wait(std::span(&input, 1), deadline)) return false;
    if (input.happened != 0 && inputEnded()) m_watchInput = false;
    return input.happened == 0 || m_watchInput;
}

}  // namespace vexa::client
