#include "client/spectrum/SpectrumWatch.h"

#include <algorithm>
#include <array>
#include <initializer_list>

#include "client/terminal/Poll.h"

namespace vexa::client {

using std::chrono::milliseconds;
using std::chrono::steady_clock;

namespace {

using Moment = std::optional<steady_clock::time_point>;

bool isOver(Moment end) {
    return end && steady_clock::now() >= *end;
}

/// The shortest of the waits for these moments and for the next drawing.
std::optional<milliseconds> waitLimit(std::initializer_list<Moment> moments,
                                      std::optional<milliseconds> redraw) {
    std::optional<milliseconds> limit = redraw;
    for (const Moment& moment : moments) {
        if (!moment) continue;
        const auto left = std::chrono::ceil<milliseconds>(*moment - steady_clock::now());
        limit = std::min(limit.value_or(left), left);
    }
    return limit ? std::optional(std::max(*limit, milliseconds(0))) : std::nullopt;
}

Polled watchedSide(const SideShow* side) {
    if (side == nullptr) return {-1, 0};
    return {side->descriptor(), side->events()};
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
        std::array<Polled, 4> watched{{{scan.descriptor(), scan.events()},
                                       {signals.descriptor(), kReadable},
                                       {output.keyDescriptor(), kReadable},
                                       watchedSide(side)}};
        waitFor(watched, waitLimit({end, side == nullptr ? std::nullopt : side->wake()}, redraw));
        if (stopAsked(signals, output)) break;
        if (watched[2].happened != 0 && output.isQuitKey()) break;
        output.show(scan.process(), scan.view());
        if (side != nullptr) output.showSide(side->process());
    }
    scan.stop();
    output.finish(scan.view());
}

}  // namespace vexa::client
