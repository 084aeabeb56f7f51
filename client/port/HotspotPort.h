#pragma once

#include <json/value.h>

#include <chrono>
#include <cstdint>
#include <functional>
#include <optional>
#include <string>

#include "client/port/Checkpoints.h"
#include "client/port/Event.h"
#include "client/port/WebSocketClient.h"
#include "client/terminal/ClientError.h"
#include "client/terminal/Deadline.h"
#include "client/terminal/EventLoop.h"
#include "client/terminal/WaitNotice.h"

namespace vexa::client {

/// A conversation with the hotspot port. Every client hears every event, and an event does not say whose
/// command it answers: what has arrived is told apart by its content, and by checkpoints behind the command.
class HotspotPort {
public:
    /// Connects. Throws ClientError. Each question waits for `limit` at most.
    HotspotPort(std::uint16_t port, Signals& signals, std::chrono::milliseconds limit);

    /// Looks at the payload of an event; true if it is what the question was for.
    using Accepts = std::function<bool(const Json::Value& payload)>;

    struct Answer {
        /// The payload that was accepted, or else the last one of this event. None: the service has not sent
        /// the event, as it does for want of an adapter.
        std::optional<Json::Value> payload;
        bool isAccepted = false;
        /// Without an accepted payload: the service has an adapter.
        bool cardIn = false;
    };

    /// Sends a command and waits for an acceptable event of this name, or until the service has certainly
    /// gone past the command without one. Throws NoAnswer.
    Answer ask(const std::string& command, const std::optional<std::string>& data, const std::string& event,
               const Accepts& accepts);

    /// The same for a question that changes nothing. A service that has just started listens before it knows
    /// its adapter well enough to answer; it is asked again, for a while.
    Answer question(const std::string& command, const Accepts& accepts);

    /// Whether the service has an adapter. Throws NoAnswer.
    bool hasAdapter();

    /// Returns when the service has handled everything that was told before; what it tells until then is
    /// passed over. Throws NoAnswer.
    void waitUntilHandled() { hasAdapter(); }

    /// Sends a command that nothing answers.
    void tell(const std::string& command, const std::optional<std::string>& data = std::nullopt);

    /// The next event. Nothing if none comes before the deadline. Throws NoAnswer.
    std::optional<Event> next(Deadline deadline);

    /// From now on `q` ends the waiting too.
    void endWith(TerminalMode& keys) { m_loop.use(keys); }

    /// Sees to it that the service gets what was told.
    void close();

private:
    void sendCheck();
    std::optional<Event> nextAnswer(Deadline deadline, WaitNotice& notice);

    WebSocketClient m_client;
    EventLoop m_loop;
    std::chrono::milliseconds m_limit;
    Checkpoints m_checkpoints;
};

/// For events of which the first will do.
bool acceptsAny(const Json::Value& payload);

}  // namespace vexa::client
