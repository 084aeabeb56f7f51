#pragma once

#include <chrono>
#include <iostream>
#include <string>
#include <utility>

#include "client/terminal/Deadline.h"
#include "client/terminal/Terminal.h"

namespace vexa::client {

/// Says once what is waited for, when that takes long: to a user in front of a terminal, on standard error.
class WaitNotice {
public:
    static constexpr const char* kCtrlCEnds = "; Ctrl-C ends it";
    static constexpr const char* kNoWayOut = "";

    /// `what`: as in "an answer of the service"; `wayOut`: what the user can do about it.
    explicit WaitNotice(std::string what, const char* wayOut = kCtrlCEnds)
        : m_what(std::move(what)), m_wayOut(wayOut) {}

    /// When tick() has something to say.
    Deadline due() const { return m_due; }

    void tick() {
        if (!m_due.isOver()) return;
        m_due = Deadline::never();
        std::cerr << "vexa: waiting for " << m_what << m_wayOut << std::endl;
    }

private:
    static constexpr std::chrono::milliseconds kPatience{2000};

    std::string m_what;
    const char* m_wayOut;
    Deadline m_due = isErrorTerminal() ? Deadline::in(kPatience) : Deadline::never();
};

}  // namespace vexa::client
