#pragma once

#include <span>

#include "client/terminal/Deadline.h"
#include "client/terminal/Poll.h"
#include "client/terminal/Signals.h"
#include "client/terminal/TerminalMode.h"

namespace vexa::client {

/// Where a command waits, whatever it waits for. What the user wants of a waiting command has its answer
/// here: Ctrl-C ends the wait, so does `q` where keys are read, and Ctrl-Z gives the terminal back until the
/// process goes on.
class EventLoop {
public:
    /// `terminal`, if not null, is the mode that the terminal is in. Both must outlive this.
    explicit EventLoop(Signals& signals, TerminalMode* terminal = nullptr)
        : m_signals(signals), m_terminal(terminal) {}

    /// From now on the terminal is in this mode.
    void use(TerminalMode& terminal) { m_terminal = &terminal; }

    /// Waits until something has happened on one of these, or until the deadline. May return early with
    /// nothing, as it does when a child has ended. False: the user has had enough.
    bool wait(std::span<Polled> polled, Deadline deadline);

    /// The same for a single one that is looked at in any case.
    bool wait(Polled one, Deadline deadline) { return wait(std::span(&one, 1), deadline); }

    /// The same for nothing but the user.
    bool wait(Deadline deadline) { return wait(std::span<Polled>(), deadline); }

    /// The exit code of a command whose wait a signal has ended, in any loop: 128 and the number of the
    /// signal, 130 for Ctrl-C. 0: none has.
    static int stopCode() { return s_stopCode; }

private:
    bool takeSignals();
    void suspend();

    Signals& m_signals;
    TerminalMode* m_terminal;
    static inline int s_stopCode = 0;
};

}  // namespace vexa::client
