#pragma once

#include <chrono>
#include <optional>
#include <string>
#include <vector>

#include "client/spectrum/SideShow.h"
#include "client/spectrum/SpectralScan.h"
#include "client/terminal/Deadline.h"
#include "client/terminal/Signals.h"
#include "client/terminal/TerminalScreen.h"

namespace vexa::client {

/// How a running scan is shown: a picture on a terminal, a line per event elsewhere.
class SpectrumOutput {
public:
    enum class Form { Readable, Json };

    /// `side`, if not null, is shown under the picture, or between the events.
    explicit SpectrumOutput(Form form, const SideShow* side = nullptr);

    void show(const std::vector<SpectralScan::Told>& told, const SpectralView& view);

    /// What is told beside the spectrum.
    void showSide(const std::vector<SideShow::Item>& items);

    /// Draws what has changed, but not too often. Gives when it should be called again although nothing has
    /// happened.
    Deadline refresh(const SpectralView& view);

    /// The last picture, and one line that says what was seen.
    void finish(const SpectralView& view);

    /// The terminal was resized, or this process is to be suspended.
    void handleSignal(Signal signal);

    int keyDescriptor() const { return m_screen ? m_screen->keys().descriptor() : -1; }

    /// Reads a key; true if it asks for the end.
    bool isQuitKey();

    /// Nobody reads the output any more.
    bool isGone() const;

private:
    void printLine(const SpectralScan::Told& told, const SpectralView& view) const;
    void printSummary(const SpectralView& view) const;
    std::vector<std::string> picture(const SpectralView& view) const;

    Form m_form;
    const SideShow* m_side;
    std::optional<TerminalScreen> m_screen;
    std::chrono::steady_clock::time_point m_start;
    Deadline m_nextDrawing = Deadline::in({});
    bool m_changed = true;
};

}  // namespace vexa::client
