#pragma once

#include <memory>
#include <optional>

namespace vexa::client {

/// What the operating system tells a command: one of four ways to ask for its end, of which the first is
/// Ctrl-C; a child has ended, the user wants it to pause, the terminal has another size.
enum class Signal { Interrupt, Quit, HangUp, Terminate, Child, Suspend, Resize };

/// Turns the signals that concern a command into things to read. From construction on they interrupt nothing;
/// whoever waits for descriptor() takes them one by one. One at a time exists in a process.
class Signals {
public:
    Signals();
    ~Signals();
    Signals(const Signals&) = delete;
    Signals& operator=(const Signals&) = delete;

    int descriptor() const;

    /// The next signal, or nothing if none is waiting.
    std::optional<Signal> take();

    /// Stops this process as Ctrl-Z does; returns when it is continued.
    static void suspend();

private:
    struct State;
    std::unique_ptr<State> m_state;
};

}  // namespace vexa::client
