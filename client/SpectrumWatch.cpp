#include "client/SpectrumWatch.h"

#include <poll.h>

#include <algorithm>
#include <array>

namespace vexa::client {

using std::chrono::milliseconds;
using std::chrono::steady_clock;

namespace {

using Deadline = std::optional<steady_clock::time_point>;

/// For poll(): the shorter of the two waits, -1 if there is none.
int pollTimeout(const Deadline& deadline, std::optional<milliseconds> redraw) {
    milliseconds wait{-1};
    if (deadline)
        wait = std::max(milliseconds(0), std::chrono::ceil<milliseconds>(*deadline - steady_clock::now()));
    if (redraw && (wait.count() < 0 || *redraw < wait)) wait = *redraw;
    return static_cast<int>(wait.count());
}

bool stopAsked(Signals& signals, SpectrumOutput& output) {
    while (const auto signal = signals.take()) {
        if (Signals::isStop(*signal)) return true;
        output.handleSignal(*signal);
    }
    return false;
}

}  // namespace

void watchSpectrum(SpectralScan& scan, Signals& signals, SpectrumOutput::Form form,
                   std::optional<milliseconds> limit) {
    SpectrumOutput output(form);
    const Deadline deadline = limit ? Deadline(steady_clock::now() + *limit) : std::nullopt;
    scan.start();
    while (!output.isGone() && !(deadline && steady_clock::now() >= *deadline)) {
        const auto redraw = output.refresh(scan.view());
        std::array<pollfd, 3> watched{{{scan.descriptor(), scan.events(), 0},
                                       {signals.descriptor(), POLLIN, 0},
                                       {output.keyDescriptor(), POLLIN, 0}}};
        ::poll(watched.data(), watched.size(), pollTimeout(deadline, redraw));
        if (stopAsked(signals, output)) break;
        if (watched[2].revents != 0 && output.isQuitKey()) break;
        output.show(scan.process(), scan.view());
    }
    scan.stop();
    output.finish(scan.view());
}

}  // namespace vexa::client
