#include "client/SpectrumWatch.h"

#include <poll.h>

#include <algorithm>
#include <array>
#include <initializer_list>

namespace vexa::client {

using std::chrono::milliseconds;
using std::chrono::steady_clock;

namespace {

using Moment = std::optional<steady_clock::time_point>;

bool isOver(Moment end) {
    return end && steady_clock::now() >= *end;
}

/// For poll(): the shortest of the waits for these moments and for the next drawing, -1 if there is none.
int pollTimeout(std::initializer_list<Moment> moments, std::optional<milliseconds> redraw) {
    std::optional<milliseconds> timeout = redraw;
    for (const Moment& moment : moments) {
        if (!moment) continue;
        const auto left = std::chrono::ceil<milliseconds>(*moment - steady_clock::now());
        timeout = std::min(timeout.value_or(left), left);
    }
    return timeout ? static_cast<int>(std::max(*timeout, milliseconds(0)).count()) : -1;
}

pollfd watchedSide(const SideShow* side) {
    if (side == nullptr) return {-1, 0, 0};
    return {side->descriptor(), side->events(), 0};
}

bool stopAsked(Signals& signals, SpectrumOutput& output) {
    while (const auto signal = signals.take()) {
        if (Signals::isStop(*signal)) return true;
        output.handleSignal(*signal);
    }
    return false;
}

}  // namespace

void watchSpectrum(SpectralScan& scan, Signals& signals, SpectrumOutput& output,
                   std::optional<steady_clock::time_point> end, SideShow* side) {
    scan.start();
    while (!output.isGone() && !isOver(end)) {
        const auto redraw = output.refresh(scan.view());
        std::array<pollfd, 4> watched{{{scan.descriptor(), scan.events(), 0},
                                       {signals.descriptor(), POLLIN, 0},
                                       {output.keyDescriptor(), POLLIN, 0},
                                       watchedSide(side)}};
        ::poll(watched.data(), watched.size(),
               pollTimeout({end, side == nullptr ? std::nullopt : side->wake()}, redraw));
        if (stopAsked(signals, output)) break;
        if (watched[2].revents != 0 && output.isQuitKey()) break;
        output.show(scan.process(), scan.view());
        if (side != nullptr) output.showSide(side->process());
    }
    scan.stop();
    output.finish(scan.view());
}

}  // namespace vexa::client
