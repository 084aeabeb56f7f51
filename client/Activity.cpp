#include "client/Activity.h"

#include <poll.h>

#include <algorithm>
#include <array>

namespace vexa::client {

using std::chrono::milliseconds;
using std::chrono::steady_clock;

namespace {

bool stopAsked(Signals& signals) {
    while (const auto signal = signals.take()) {
        if (Signals::isStop(*signal)) return true;
        if (*signal == SIGTSTP) Signals::suspend();
    }
    return false;
}

}  // namespace

Activity waitForActivity(int descriptor, short events, Signals& signals, std::optional<milliseconds> limit) {
    const auto deadline = steady_clock::now() + limit.value_or(milliseconds(0));
    while (true) {
        int timeout = -1;
        if (limit) {
            const auto left = std::chrono::ceil<milliseconds>(deadline - steady_clock::now());
            timeout = static_cast<int>(std::max(left, milliseconds(0)).count());
        }
        std::array<pollfd, 2> watched{{{descriptor, events, 0}, {signals.descriptor(), POLLIN, 0}}};
        const int count = ::poll(watched.data(), watched.size(), timeout);
        if (stopAsked(signals)) return Activity::StopAsked;
        if (watched[0].revents != 0) return Activity::Ready;
        if (count == 0) return Activity::Timeout;
    }
}

}  // namespace vexa::client
