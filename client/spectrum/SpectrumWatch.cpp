#include "client/spectrum/SpectrumWatch.h"

#include <algorithm>
#include <array>

#include "client/terminal/Poll.h"

namespace vexa::client {

namespace {

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

void watchSpectrum(SpectralScan& scan, Signals& signals, SpectrumOutput& output, Deadline end,
                   SideShow* side) {
    scan.start();
    while (!output.isGone() && !end.isOver()) {
        const Deadline redraw = output.refresh(scan.view());
        std::array<Polled, 4> watched{{{scan.descriptor(), scan.events()},
                                       {signals.descriptor(), kReadable},
                                       {output.keyDescriptor(), kReadable},
                                       watchedSide(side)}};
        waitFor(watched, std::min({end, redraw, side == nullptr ? Deadline::never() : side->wake()}));
        if (stopAsked(signals, output)) break;
        if (watched[2].happened != 0 && output.isQuitKey()) break;
        output.show(scan.process(), scan.view());
        if (side != nullptr) output.showSide(side->process());
    }
    scan.stop();
    output.finish(scan.view());
}

}  // namespace vexa::client
