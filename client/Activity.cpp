#include "client/Activity.h"

#include <poll.h>

#include <algorithm>
#include <vector>

namespace vexa::client {

using std::chrono::milliseconds;
using std::chrono::steady_clock;

namespace {

void suspend(TerminalKeys* keys) {
    if (keys != nullptr) keys->leave();
    Signals::suspend();
    if (keys != nullptr) keys->enter();
}

bool stopAsked(Signals& signals, TerminalKeys* keys) {
    while (const auto signal = signals.take()) {
        if (Signals::isStop(*signal)) return true;
        if (*signal == SIGTSTP) suspend(keys);
    }
    return false;
}

bool anyReady(std::span<const pollfd> watched) {
    return std::any_of(watched.begin(), watched.end(), [](const pollfd& one) { return one.revents != 0; });
}

}  // namespace

Activity waitForActivity(int descriptor, short events, Signals& signals, std::optional<milliseconds> limit) {
    const Awaited only{descriptor, events};
    return waitForActivity(std::span(&only, 1), signals, nullptr, limit);
}

Activity waitForActivity(std::span<const Awaited> awaited, Signals& signals, TerminalKeys* keys,
                         std::optional<milliseconds> limit) {
    const auto deadline = steady_clock::now() + limit.value_or(milliseconds(0));
    while (true) {
        int timeout = -1;
        if (limit) {
            const auto left = std::chrono::ceil<milliseconds>(deadline - steady_clock::now());
            timeout = static_cast<int>(std::max(left, milliseconds(0)).count());
        }
        std::vector<pollfd> watched{{signals.descriptor(), POLLIN, 0},
                                    {keys == nullptr ? -1 : keys->descriptor(), POLLIN, 0}};
        for (const Awaited& one : awaited)
            watched.push_back({one.descriptor, one.events, 0});
        const int count = ::poll(watched.data(), watched.size(), timeout);
        if (stopAsked(signals, keys)) return Activity::StopAsked;
        if (watched[1].revents != 0 && keys->takeQuit()) return Activity::StopAsked;
        if (anyReady(std::span(watched).subspan(2))) return Activity::Ready;
        if (count == 0) return Activity::Timeout;
    }
}

}  // namespace vexa::client
