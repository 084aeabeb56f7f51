#include "client/terminal/TerminalScreen.h"

#include <algorithm>
#include <cstdlib>
#include <iostream>
#include <utility>

#include "client/terminal/Terminal.h"
#include "client/terminal/Text.h"

namespace vexa::client {

namespace {

constexpr const char* kEnter = "\033[?1049h\033[?25l\033[?7l\033[2J";
constexpr const char* kLeave = "\033[?7h\033[?25h\033[?1049l";
constexpr const char* kHome = "\033[H";
constexpr const char* kClearLine = "\033[K";
constexpr const char* kClearBelow = "\033[J";

}  // namespace

bool TerminalScreen::isUsable() {
    return canPlaceCursor();
}

bool TerminalScreen::wantsColour() {
    const char* const refusal = std::getenv("NO_COLOR");
    return refusal == nullptr || *refusal == '\0';
}

bool TerminalScreen::isUtf8() {
    return showsUtf8();
}

TerminalScreen::TerminalScreen() {
    enter();
}

TerminalScreen::~TerminalScreen() {
    leave();
}

void TerminalScreen::enter() {
    if (m_entered) return;
    m_keys.enter();
    std::cout << kEnter << std::flush;
    m_entered = true;
    resized();
}

void TerminalScreen::leave() {
    if (!m_entered) return;
    std::cout << kLeave << std::flush;
    m_keys.leave();
    m_entered = false;
}

void TerminalScreen::draw(std::vector<std::string> lines, std::size_t heading) {
    m_lines = std::move(lines);
    m_heading = heading;
    paint();
}

bool TerminalScreen::takeQuit() {
    const auto key = m_keys.take();
    if (key && *key != Key::Quit) move(*key);
    return key == Key::Quit;
}

// The last row is for what does not show. A heading that would leave no row for the rest moves, too.
TerminalScreen::Part TerminalScreen::shownPart() const {
    const auto rows = static_cast<std::size_t>(m_rows);
    if (m_lines.size() <= rows) return {0, 0, m_lines.size()};
    const std::size_t room = rows - 1;
    const std::size_t heading = m_heading < room ? m_heading : 0;
    const std::size_t first = std::min(heading + m_moved, m_lines.size() - (room - heading));
    return {heading, first, first + (room - heading)};
}

std::string TerminalScreen::hiddenRows(const Part& part) const {
    const std::size_t above = part.first - part.heading;
    const std::size_t below = m_lines.size() - part.last;
    std::string text;
    if (above > 0) text = std::to_string(above) + " above";
    if (below > 0) text += (above > 0 ? ", " : "") + std::to_string(below) + " below";
    text += keyDescriptor() < 0 ? "; enlarge the window" : "; arrows, PageUp, PageDown, Home, End";
    return cutToColumns(text, m_columns, ellipsis());
}

void TerminalScreen::move(Key key) {
    const Part part = shownPart();
    const std::size_t page = part.last - part.first;
    const std::size_t before = part.first - part.heading;
    const std::size_t most = before + m_lines.size() - part.last;
    std::size_t moved = before;
    if (key == Key::Up) moved = before - std::min<std::size_t>(before, 1);
    if (key == Key::Down) moved = before + 1;
    if (key == Key::PageUp) moved = before - std::min(before, page);
    if (key == Key::PageDown) moved = before + page;
    if (key == Key::Home) moved = 0;
    if (key == Key::End) moved = most;
    m_moved = std::min(moved, most);
    paint();
}

void TerminalScreen::paint() {
    const Part part = shownPart();
    std::vector<std::string> rows(m_lines.begin(),
                                  m_lines.begin() + static_cast<std::ptrdiff_t>(part.heading));
    rows.insert(rows.end(), m_lines.begin() + static_cast<std::ptrdiff_t>(part.first),
                m_lines.begin() + static_cast<std::ptrdiff_t>(part.last));
    if (rows.size() < m_lines.size()) rows.push_back(hiddenRows(part));
    // Behind a row that fills its line the cursor still stands on the last character.
    std::string frame = kHome;
    for (std::size_t i = 0; i < rows.size(); ++i)
        frame +=
            (i > 0 ? "\r\n" : "") + std::string(i + 1 < rows.size() ? kClearLine : kClearBelow) + rows[i];
    std::cout << frame << std::flush;
    m_needsDrawing = false;
}

void TerminalScreen::resized() {
    m_needsDrawing = true;
    const auto size = terminalSize();
    if (!size) return;
    m_columns = size->columns;
    m_rows = size->rows;
}

}  // namespace vexa::client
