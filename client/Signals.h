#pragma once

#include <csignal>
#include <optional>

#include "client/Descriptor.h"

namespace vexa::client {

/// Turns the signals that concern a command into things to read. From construction on they interrupt nothing;
/// whoever polls descriptor() takes them one by one. One at a time exists in a process.
class Signals {
public:
    Signals();
    ~Signals();
    Signals(const Signals&) = delete;
    Signals& operator=(const Signals&) = delete;

    int descriptor() const { return m_descriptor.get(); }

    /// The next signal, or nothing if none is waiting.
    std::optional<int> take();

    /// True for the signals that ask a command to end.
    static bool isStop(int signal);

    /// Stops this process as Ctrl-Z does; returns when it is continued.
    static void suspend();

private:
    sigset_t m_before{};
    Descriptor m_descriptor;
};

}  // namespace vexa::client
