#include "client/hotspot/ChangeTurn.h"

#include <string>

#include "client/port/Activity.h"
#include "client/port/HotspotPort.h"

namespace vexa::client {

using std::chrono::milliseconds;
using std::chrono::steady_clock;

namespace {

constexpr milliseconds kBetweenAttempts{10};

// Of the account too: others do not get into the service, and need no turn.
std::string turnName(std::uint16_t port) {
    return "vexa-credentials-" + accountTag() + "-" + std::to_string(port);
}

}  // namespace

ChangeTurn::ChangeTurn(std::uint16_t port, Signals& signals, milliseconds limit) {
    const auto deadline = steady_clock::now() + limit;
    while (!(m_holder = takeKernelName(turnName(port)))) {
        if (steady_clock::now() >= deadline)
            throw ClientError("another vexa is changing the credentials and does not come to an end");
        if (waitForActivity(-1, 0, signals, kBetweenAttempts) == Activity::StopAsked)
            throw StoppedByUser("stopped before anything was changed");
    }
}

}  // namespace vexa::client
