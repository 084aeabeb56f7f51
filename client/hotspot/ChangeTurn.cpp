#include "client/hotspot/ChangeTurn.h"

#include <string>

#include "client/terminal/ClientError.h"
#include "client/terminal/EventLoop.h"
#include "client/terminal/WaitNotice.h"

namespace vexa::client {

using std::chrono::milliseconds;

namespace {

constexpr milliseconds kBetweenAttempts{10};

// Of the account too: others do not get into the service, and need no turn.
std::string turnName(std::uint16_t port) {
    return "vexa-credentials-" + accountTag() + "-" + std::to_string(port);
}

}  // namespace

ChangeTurn::ChangeTurn(std::uint16_t port, Signals& signals, milliseconds limit) {
    EventLoop loop(signals);
    const Deadline deadline = Deadline::in(limit);
    WaitNotice notice("another vexa that is changing the credentials");
    while (!(m_holder = takeKernelName(turnName(port)))) {
        if (deadline.isOver())
            throw ClientError("another vexa is changing the credentials and does not come to an end");
        notice.tick();
        if (!loop.wait(Deadline::in(kBetweenAttempts)))
            throw StoppedByUser("stopped before anything was changed");
    }
}

}  // namespace vexa::client
