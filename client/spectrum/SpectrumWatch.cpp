#include "client/spectrum/SpectrumWatch.h"

#include <algorithm>
#include <array>

#include "client/terminal/EventLoop.h"

namespace vexa::client {

namespace {

constexpr const char* kResumed =
    "no values came for a while: another client may have stopped the scan, it was asked for again";

}  // namespace

void watchSpectrum(SpectralScan& scan, Signals& signals, SpectrumOutput& output, Deadline end,
                   SideShow* side) {
    EventLoop loop(signals, output.terminal());
    scan.start();
    while (!output.isGone() && !end.isOver()) {
        const Deadline redraw = output.refresh(scan.view());
        std::array polled{scan.polled(), side == nullptr ? Polled{-1, 0} : side->polled()};
        const Deadline wake = side == nullptr ? Deadline::never() : side->wake();
        if (!loop.wait(polled, std::min({end, redraw, wake, scan.wake()}))) break;
        scan.renew();
        output.show(scan.process(), scan.view());
        if (side == nullptr && scan.hasResumed()) output.note(kResumed);
        if (side != nullptr) output.showSide(side->process());
    }
    scan.stop();
    output.finish(scan.view());
}

}  // namespace vexa::client
