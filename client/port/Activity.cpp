#include "client/port/Activity.h"

#include <algorithm>
#include <vector>

#include "client/terminal/Poll.h"

namespace vexa::client {

namespace {

void suspend(TerminalKeys* keys) {
    if (keys != nullptr) keys->leave();
    Signals::suspend();
    if (keys != nullptr) keys->enter();
}

bool stopAsked(Signals& signals, TerminalKeys* keys) {
    while (const auto signal = signals.take()) {
        if (Signals::isStop(*signal)) return true;
        if (*signal == Signal::Suspend) suspend(keys);
    }
    return false;
}

bool anyReady(std::span<const Polled> watched) {
    return std::any_of(watched.begin(), watched.end(), [](const Polled& one) { return one.happened != 0; });
}

}  // namespace

Activity waitForActivity(int descriptor, short events, Signals& signals, Deadline deadline) {
    const Awaited only{descriptor, events};
    return waitForActivity(std::span(&only, 1), signals, nullptr, deadline);
}

Activity waitForActivity(std::span<const Awaited> awaited, Signals& signals, TerminalKeys* keys,
                         Deadline deadline) {
    while (true) {
        std::vector<Polled> watched{{signals.descriptor(), kReadable},
                                    {keys == nullptr ? -1 : keys->descriptor(), kReadable}};
        for (const Awaited& one : awaited)
            watched.push_back({one.descriptor, one.events});
        waitFor(watched, deadline);
        if (stopAsked(signals, keys)) return Activity::StopAsked;
        if (watched[1].happened != 0 && keys->takeQuit()) return Activity::StopAsked;
        if (anyReady(std::span(watched).subspan(2))) return Activity::Ready;
        if (deadline.isOver()) return Activity::Timeout;
    }
}

}  // namespace vexa::client
