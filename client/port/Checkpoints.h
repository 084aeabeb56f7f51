#pragma once

#include "client/port/Event.h"
#include "contract/Ports.h"

namespace vexa::client {

/// Tells how far the service has come. It handles what it is told in order: once it has answered a question
/// that was sent behind a command, it has gone past the command. Every client hears every answer, and no
/// answer says whose it is; so they are counted. Pure: fed with what is sent and what comes.
class Checkpoints {
public:
    /// The question; it is answered whatever the state of the service.
    static constexpr const char* kQuestion = contract::kGetIsCardIn;

    /// What is still owed for earlier questions tells nothing from here on.
    void begin();

    /// The question is on its way.
    void ask() { ++m_owed; }

    /// Takes in an event. True if it answers a question that was asked since begin().
    bool take(const Event& event);

    bool isAsked() const { return m_owed > m_stale || m_answers > 0; }

    /// Everything that was sent before the first question since begin() has certainly been handled.
    bool isPassed() const;

private:
    int m_owed = 0;
    int m_stale = 0;
    int m_answers = 0;
};

}  // namespace vexa::client
