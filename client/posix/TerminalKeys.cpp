#include "client/terminal/TerminalKeys.h"

#include <termios.h>
#include <unistd.h>

#include "client/posix/KeyParser.h"
#include "client/terminal/Poll.h"

namespace vexa::client {

struct TerminalKeys::State {
    std::optional<termios> before;
    bool isReading = false;
    KeyParser parser;
};

TerminalKeys::TerminalKeys() : m_state(std::make_unique<State>()) {
    enter();
}

TerminalKeys::~TerminalKeys() {
    leave();
}

void TerminalKeys::enter() {
    termios settings{};
    if (m_state->before || ::tcgetattr(STDIN_FILENO, &settings) != 0) return;
    m_state->before = settings;
    settings.c_lflag &= ~static_cast<tcflag_t>(ICANON | ECHO);
    settings.c_cc[VMIN] = 0;
    settings.c_cc[VTIME] = 0;
    m_state->isReading = ::tcsetattr(STDIN_FILENO, TCSANOW, &settings) == 0;
}

void TerminalKeys::leave() {
    if (m_state->before) ::tcsetattr(STDIN_FILENO, TCSANOW, &*m_state->before);
    m_state->before.reset();
    m_state->isReading = false;
}

int TerminalKeys::keyDescriptor() const {
    return m_state->isReading ? kStandardInput : -1;
}

std::optional<Key> TerminalKeys::take() {
    char byte = 0;
    if (::read(STDIN_FILENO, &byte, 1) == 1) return m_state->parser.take(byte);
    // With this terminal mode a readable descriptor without a key is a terminal that has gone.
    m_state->isReading = false;
    return std::nullopt;
}

}  // namespace vexa::client
