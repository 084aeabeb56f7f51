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

std::optional<Key> TerminalKeys::take() {
    const auto key = takeKey();
    if (!key) return std::nullopt;
    switch (key->code) {
        case VK_UP:
            return Key::Up;
        case VK_DOWN:
            return Key::Down;
        case VK_PRIOR:
            return Key::PageUp;
        case VK_NEXT:
            return Key::PageDown;
        case VK_HOME:
            return Key::Home;
        case VK_END:
            return Key::End;
        default:
            return key->character == L'q' || key->character == L'Q' ? Key::Quit : Key::Other;
    }
}

}  // namespace vexa::client
