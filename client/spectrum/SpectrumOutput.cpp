#include "client/spectrum/SpectrumOutput.h"

#include <iomanip>
#include <iostream>
#include <sstream>

#include "client/port/EventLines.h"
#include "client/port/JsonLine.h"
#include "client/spectrum/SpectralPicture.h"
#include "client/spectrum/SpectralText.h"
#include "client/terminal/Terminal.h"
#include "client/terminal/Text.h"

namespace vexa::client {

using std::chrono::milliseconds;
using std::chrono::steady_clock;

namespace {

constexpr milliseconds kBetweenDrawings{100};

// How things stand, and the names of the columns.
constexpr std::size_t kHeadingRows = 2;

std::string secondsSince(steady_clock::time_point start) {
    std::ostringstream out;
    out << std::fixed << std::setprecision(2) << std::setw(7)
        << std::chrono::duration<double>(steady_clock::now() - start).count() << " s";
    return out.str();
}

void printLines(const std::vector<std::string>& lines) {
    for (const auto& line : lines)
        std::cout << line << '\n';
    std::cout << std::flush;
}

}  // namespace

SpectrumOutput::SpectrumOutput(Form form, const SideShow* side)
    : m_form(form), m_side(side), m_start(steady_clock::now()) {
    if (form == Form::Readable && TerminalScreen::isUsable()) {
        m_screen.emplace();
        return;
    }
    if (TerminalKeys::isUsable()) m_keys.emplace();
    if (m_side != nullptr) printLines(m_side->opening(form == Form::Json));
}

TerminalMode* SpectrumOutput::terminal() {
    if (m_screen) return &*m_screen;
    return m_keys ? &*m_keys : nullptr;
}

void SpectrumOutput::show(const std::vector<SpectralScan::Told>& told, const SpectralView& view) {
    if (told.empty()) return;
    m_changed = true;
    if (m_screen) return;
    for (const auto& event : told)
        printLine(event, view);
    std::cout << std::flush;
}

void SpectrumOutput::showSide(const std::vector<SideShow::Item>& items) {
    if (items.empty()) return;
    m_changed = true;
    if (m_screen) return;
    for (const auto& item : items) {
        if (m_form == Form::Json && !item.json.empty())
            std::cout << item.json << '\n';
        else if (m_form == Form::Readable && !item.sentence.empty())
            std::cout << secondsSince(m_start) << "  " << item.sentence << '\n';
    }
    std::cout << std::flush;
}

void SpectrumOutput::note(const std::string& sentence) {
    if (sentence == m_note) return;
    m_note = sentence;
    m_changed = true;
    if (!m_screen) std::cerr << "vexa: " << sentence << '\n';
}

void SpectrumOutput::printLine(const SpectralScan::Told& told, const SpectralView& view) const {
    if (m_form == Form::Json) {
        std::cout << eventLine(told.text) << '\n';
    } else {
        std::cout << secondsSince(m_start) << "  " << describeEvent(told.event, told.update, view) << '\n';
    }
}

Deadline SpectrumOutput::refresh(const SpectralView& view) {
    if (!m_screen || !(m_changed || m_screen->needsDrawing())) return Deadline::never();
    if (!m_nextDrawing.isOver()) return m_nextDrawing;
    auto lines = picture(view);
    lines.front() += "   (q or Ctrl-C ends)";
    m_screen->draw(std::move(lines), m_note.empty() ? kHeadingRows : kHeadingRows + 1);
    m_changed = false;
    m_nextDrawing = Deadline::in(kBetweenDrawings);
    return Deadline::never();
}

void SpectrumOutput::finish(const SpectralView& view) {
    m_keys.reset();
    if (m_screen) {
        const auto lines = picture(view);
        m_screen.reset();
        printLines(lines);
    }
    printSummary(view);
}

void SpectrumOutput::printSummary(const SpectralView& view) const {
    if (m_form == Form::Json) {
        Json::Value object = summaryJson(view);
        if (m_side != nullptr) m_side->addSummary(object);
        std::cout << jsonLine(object) << std::endl;
    } else {
        std::cout << summaryText(view) << (m_side != nullptr ? "; " + m_side->summary() : "") << std::endl;
    }
}

std::vector<std::string> SpectrumOutput::picture(const SpectralView& view) const {
    auto lines =
        drawSpectrum(view, {m_screen->columns(), TerminalScreen::wantsColour(), TerminalScreen::isUtf8()});
    if (!m_note.empty())
        lines.insert(lines.begin() + 1, cutToColumns(m_note, m_screen->columns() - 1, ellipsis()));
    if (m_side == nullptr) return lines;
    const int left = m_screen->rows() - static_cast<int>(lines.size());
    const auto below =
        m_side->lines({m_screen->columns(), left, m_screen->rows(), TerminalScreen::wantsColour()});
    lines.insert(lines.end(), below.begin(), below.end());
    return lines;
}

bool SpectrumOutput::isGone() const {
    return !std::cout;
}

}  // namespace vexa::client
