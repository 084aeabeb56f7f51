#include "client/terminal/TerminalKeys.h"

#include <windows.h>

#include "client/terminal/Poll.h"
#include "client/windows/ConsoleKeys.h"

namespace vexa::client {

struct TerminalKeys::State {
    std::optional<DWORD> before;
};

TerminalKeys::TerminalKeys() : m_state(std::make_unique<State>()) {
    enter();
}

TerminalKeys::~TerminalKeys() {
    leave();
}

void TerminalKeys::enter() {
    const HANDLE input = GetStdHandle(STD_INPUT_HANDLE);
    DWORD mode = 0;
    if (m_state->before || GetConsoleMode(input, &mode) == 0) return;
    if (SetConsoleMode(input, ENABLE_PROCESSED_INPUT | ENABLE_WINDOW_INPUT) != 0) m_state->before = mode;
}

void TerminalKeys::leave() {
    if (m_state->before) SetConsoleMode(GetStdHandle(STD_INPUT_HANDLE), *m_state->before);
    m_state->before.reset();
}

int TerminalKeys::keyDescriptor() const {
    return m_state->before ? kStandardInput : -1;
}

std::optional<char> TerminalKeys::take() {
    const auto key = takeKey();
    if (!key || *key >= 0x80) return std::nullopt;
    return static_cast<char>(*key);
}

}  // namespace vexa::client
