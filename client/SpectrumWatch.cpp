#include "client/SpectrumWatch.h"

#include <poll.h>

#include <algorithm>
#include <array>

namespace vexa::client {

using std::chrono::milliseconds;
using std::chrono::steady_clock;

namespace {

bool isOver(std::optional<steady_clock::time_point> end) {
    return end && steady_clock::now() >= *end;
}

/// For poll(): the shorter of the wait for the end and the wait for the next drawing, -1 if there is none.
int pollTimeout(std::optional<steady_clock::time_point> end, std::optional<milliseconds> redraw) {
    if (!end) return redraw ? static_cast<int>(redraw->count()) : -1;
    const auto left = std::max(milliseconds(0), std::chrono::ceil<milliseconds>(*end - steady_clock::now()));
    return static_cast<int>(std::min(left, redraw.value_or(left)).count());
}

pollfd watchedNews(const HotspotNews* news) {
    if (news == nullptr) return {-1, 0, 0};
    return {news->descriptor(), news->events(), 0};
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
                   std::optional<steady_clock::time_point> end, HotspotNews* news) {
    scan.start();
    while (!output.isGone() && !isOver(end)) {
        const auto redraw = output.refresh(scan.view());
        std::array<pollfd, 4> watched{{{scan.descriptor(), scan.events(), 0},
                                       {signals.descriptor(), POLLIN, 0},
                                       {output.keyDescriptor(), POLLIN, 0},
                                       watchedNews(news)}};
        ::poll(watched.data(), watched.size(), pollTimeout(end, redraw));
        if (stopAsked(signals, output)) break;
        if (watched[2].revents != 0 && output.isQuitKey()) break;
        output.show(scan.process(), scan.view());
        if (news != nullptr) output.showNews(news->process(), news->lines());
    }
    scan.stop();
    output.finish(scan.view());
}

}  // namespace vexa::client
