#include "client/SpectrumWatch.h"

#include <poll.h>

#include <algorithm>
#include <array>

namespace vexa::client {

using std::chrono::milliseconds;
using std::chrono::steady_clock;

namespace {

/// The moment at which the watch is over; without a limit it never comes.
class Deadline {
public:
    explicit Deadline(std::optional<milliseconds> limit) : m_limited(limit.has_value()) {
        m_end = steady_clock::now() + limit.value_or(milliseconds(0));
    }

    bool isOver() const { return m_limited && steady_clock::now() >= m_end; }

    /// For poll(): the shorter of the wait for the end and the wait for the next drawing, -1 if there is
    /// none.
    int pollTimeout(std::optional<milliseconds> redraw) const {
        if (!m_limited) return redraw ? static_cast<int>(redraw->count()) : -1;
        const auto left =
            std::max(milliseconds(0), std::chrono::ceil<milliseconds>(m_end - steady_clock::now()));
        return static_cast<int>(std::min(left, redraw.value_or(left)).count());
    }

private:
    bool m_limited;
    steady_clock::time_point m_end;
};

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
    const Deadline deadline(limit);
    scan.start();
    while (!output.isGone() && !deadline.isOver()) {
        const auto redraw = output.refresh(scan.view());
        std::array<pollfd, 3> watched{{{scan.descriptor(), scan.events(), 0},
                                       {signals.descriptor(), POLLIN, 0},
                                       {output.keyDescriptor(), POLLIN, 0}}};
        ::poll(watched.data(), watched.size(), deadline.pollTimeout(redraw));
        if (stopAsked(signals, output)) break;
        if (watched[2].revents != 0 && output.isQuitKey()) break;
        output.show(scan.process(), scan.view());
    }
    scan.stop();
    output.finish(scan.view());
}

}  // namespace vexa::client
