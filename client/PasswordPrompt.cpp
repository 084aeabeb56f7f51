#include "client/PasswordPrompt.h"

#include <poll.h>
#include <termios.h>
#include <unistd.h>

#include <array>
#include <iostream>
#include <optional>

#include "client/ClientError.h"
#include "client/HotspotPort.h"

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
        if (*signal != SIGTSTP) continue;
        terminal.leave();
        Signals::suspend();
        terminal.enter();
        std::cerr << prompt << std::flush;
    }
}

/// Nothing if the input ends before anything was read.
std::optional<std::string> readLine(Signals& signals, const std::string& prompt) {
    SilentTerminal terminal;
    std::cerr << prompt << std::flush;
    std::string line;
    while (true) {
        std::array<pollfd, 2> watched{{{STDIN_FILENO, POLLIN, 0}, {signals.descriptor(), POLLIN, 0}}};
        if (::poll(watched.data(), watched.size(), -1) < 0) continue;
        handleSignals(signals, terminal, prompt);
        if (watched[0].revents == 0) continue;
        char next = 0;
        const bool isEnd = ::read(STDIN_FILENO, &next, 1) != 1;
        if (isEnd && line.empty()) return std::nullopt;
        if (isEnd || next == '\n') break;
        line += next;
    }
    if (line.ends_with('\r')) line.pop_back();
    return line;
}

std::string required(const std::optional<std::string>& line) {
    if (!line || line->empty()) throw ClientError("no password was given");
    return *line;
}

std::string askOnce(Signals& signals, const std::string& prompt) {
    try {
        const auto line = readLine(signals, prompt);
        std::cerr << '\n';
        return required(line);
    } catch (const StoppedByUser&) {
        std::cerr << '\n';
        throw;
    }
}

}  // namespace

std::string readPassword(Signals& signals) {
    return required(readLine(signals, ""));
}

std::string askPassword(Signals& signals) {
    if (::isatty(STDIN_FILENO) == 0)
        throw ClientError("there is no terminal to ask for the password: give it with --password-stdin",
                          kExitWrongUse);
    std::string password = askOnce(signals, "Password: ");
    if (askOnce(signals, "Again: ") != password) throw ClientError("the two passwords differ");
    return password;
}

}  // namespace vexa::client
