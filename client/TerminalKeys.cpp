#include "client/TerminalKeys.h"

#include <unistd.h>

namespace vexa::client {

bool TerminalKeys::isUsable() {
    return ::isatty(STDIN_FILENO) != 0 && ::isatty(STDOUT_FILENO) != 0;
}

void TerminalKeys::enter() {
    termios settings{};
    if (m_before || ::tcgetattr(STDIN_FILENO, &settings) != 0) return;
    m_before = settings;
    settings.c_lflag &= ~static_cast<tcflag_t>(ICANON | ECHO);
    settings.c_cc[VMIN] = 0;
    settings.c_cc[VTIME] = 0;
    m_isReading = ::tcsetattr(STDIN_FILENO, TCSANOW, &settings) == 0;
}

void TerminalKeys::leave() {
    if (m_before) ::tcsetattr(STDIN_FILENO, TCSANOW, &*m_before);
    m_before.reset();
    m_isReading = false;
}

std::optional<char> TerminalKeys::take() {
    char key = 0;
    if (::read(STDIN_FILENO, &key, 1) == 1) return key;
    // With this terminal mode a readable descriptor without a key is a terminal that has gone.
    m_isReading = false;
    return std::nullopt;
}

bool TerminalKeys::takeQuit() {
    const auto key = take();
    return key && (*key == 'q' || *key == 'Q');
}

}  // namespace vexa::client
