#pragma once

#include <chrono>
#include <optional>
#include <string>
#include <vector>

#include "client/spectrum/SideShow.h"
#include "client/spectrum/SpectralScan.h"
#include "client/terminal/Deadline.h"
#include "client/terminal/TerminalKeys.h"
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

    /// Says this once: in the picture, or on standard error.
    void note(const std::string& sentence);

    /// Draws what has changed, but not too often. Gives when it should be called again although nothing has
    /// happened.
    Deadline refresh(const SpectralView& view);

    /// The last picture, and one line that says what was seen.
    void finish(const SpectralView& view);

    /// The mode that the terminal is in until finish(); null if it is in none.
    TerminalMode* terminal();

    /// Nobody reads the output any more.
    bool isGone() const;

private:
    void printLine(const SpectralScan::Told& told, const SpectralView& view) const;
    void printSummary(const SpectralView& view) const;
    std::vector<std::string> picture(const SpectralView& view) const;

    Form m_form;
    const SideShow* m_side;
    std::optional<TerminalScreen> m_screen;
    std::optional<TerminalKeys> m_keys;
    std::chrono::steady_clock::time_point m_start;
    Deadline m_nextDrawing = Deadline::in({});
    bool m_changed = true;
    std::string m_note;
};

}  // namespace vexa::client
