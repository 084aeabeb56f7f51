#include "client/terminal/StandardInput.h"

#include <termios.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <iostream>

#include "client/terminal/ClientError.h"
#include "client/terminal/Poll.h"

namespace vexa::client {

namespace {

/// A terminal that does not show what is typed. Does nothing where standard input is none.
class SilentTerminal {
public:
    SilentTerminal() { enter(); }
    ~SilentTerminal() { leave(); }
    SilentTerminal(const SilentTerminal&) = delete;
    SilentTerminal& operator=(const SilentTerminal&) = delete;

    void enter() {
        termios settings{};
        if (::tcgetattr(STDIN_FILENO, &settings) != 0) return;
        m_before = settings;
        settings.c_lflag &= ~static_cast<tcflag_t>(ECHO);
        ::tcsetattr(STDIN_FILENO, TCSAFLUSH, &settings);
    }

    // What was typed and not read goes: it may be half a password.
    void leave() {
        if (m_before) ::tcsetattr(STDIN_FILENO, TCSAFLUSH, &*m_before);
        m_before.reset();
    }

private:
    std::optional<termios> m_before;
};

void handleSignals(Signals& signals, SilentTerminal& terminal, const std::string& prompt) {
    while (const auto signal = signals.take()) {
        if (Signals::isStop(*signal)) throw StoppedByUser("stopped before anything was changed");
        if (*signal != Signal::Suspend) continue;
        terminal.leave();
        Signals::suspend();
        terminal.enter();
        std::cerr << prompt << std::flush;
    }
}

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
    SilentTerminal terminal;
    std::cerr << prompt << std::flush;
    std::string line;
    while (true) {
        std::array<Polled, 2> watched{{{kStandardInput, kReadable}, {signals.descriptor(), kReadable}}};
        waitFor(watched, Deadline::never());
        handleSignals(signals, terminal, prompt);
        if (watched[0].happened == 0) continue;
        char next = 0;
        const bool isEnd = readStandardInput({&next, 1}) == 0;
        if (isEnd && line.empty()) return std::nullopt;
        if (isEnd || next == '\n') break;
        line += next;
    }
    if (line.ends_with('\r')) line.pop_back();
    return line;
}

}  // namespace vexa::client
