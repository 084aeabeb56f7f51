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
    /// `what`: as in "an answer of the service".
    explicit WaitNotice(std::string what) : m_what(std::move(what)) {}

    /// When tick() has something to say.
    Deadline due() const { return m_due; }

    void tick() {
        if (!m_due.isOver()) return;
        m_due = Deadline::never();
        std::cerr << "vexa: waiting for " << m_what << "; Ctrl-C ends it" << std::endl;
    }

private:
    static constexpr std::chrono::milliseconds kPatience{2000};

    std::string m_what;
    Deadline m_due = isErrorTerminal() ? Deadline::in(kPatience) : Deadline::never();
};

}  // namespace vexa::client
