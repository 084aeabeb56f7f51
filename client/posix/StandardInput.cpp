#include "client/terminal/StandardInput.h"

#include <termios.h>
#include <unistd.h>

#include <cerrno>
#include <iostream>
#include <utility>

#include "client/terminal/InputLine.h"

namespace vexa::client {

namespace {

/// A terminal that shows a prompt, and not what is typed. Where standard input is none, the prompt alone.
class SilentTerminal final : public TerminalMode {
public:
    explicit SilentTerminal(std::string prompt) : m_prompt(std::move(prompt)) { enter(); }
    ~SilentTerminal() override { leave(); }

    void enter() override {
        termios settings{};
        if (::tcgetattr(STDIN_FILENO, &settings) == 0) {
            m_before = settings;
            settings.c_lflag &= ~static_cast<tcflag_t>(ECHO);
            ::tcsetattr(STDIN_FILENO, TCSAFLUSH, &settings);
        }
        std::cerr << m_prompt << std::flush;
    }

    // What was typed and not read goes: it may be half a password.
    void leave() override {
        if (m_before) ::tcsetattr(STDIN_FILENO, TCSAFLUSH, &*m_before);
        m_before.reset();
    }

private:
    std::string m_prompt;
    std::optional<termios> m_before;
};

}  // namespace

bool isInputTerminal() {
    return ::isatty(STDIN_FILENO) != 0;
}

std::size_t readStandardInput(std::span<char> buffer) {
    while (true) {
        const ssize_t count = ::read(STDIN_FILENO, buffer.data(), buffer.size());
        if (count >= 0) return static_cast<std::size_t>(count);
        if (errno != EINTR && errno != EAGAIN) return 0;
    }
}

std::optional<std::string> readHiddenLine(Signals& signals, const std::string& prompt) {
    SilentTerminal terminal(prompt);
    EventLoop loop(signals, &terminal);
    return readLine(loop);
}

}  // namespace vexa::client
