#include "client/terminal/TerminalScreen.h"

#include <algorithm>
#include <cstdlib>
#include <iostream>

#include "client/terminal/Terminal.h"
#include "client/terminal/Text.h"

namespace vexa::client {

namespace {

constexpr const char* kEnter = "\033[?1049h\033[?25l\033[?7l\033[2J";
constexpr const char* kLeave = "\033[?7h\033[?25h\033[?1049l";
constexpr const char* kHome = "\033[H";
constexpr const char* kClearLine = "\033[K";
constexpr const char* kClearBelow = "\033[J";

std::string hiddenRows(std::size_t count, int columns) {
    return cutToColumns(std::to_string(count) + " more; enlarge the window", columns,
                        TerminalScreen::ellipsis());
}

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

const char* TerminalScreen::ellipsis() {
    return isUtf8() ? "…" : "...";
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

void TerminalScreen::draw(const std::vector<std::string>& lines) {
    const auto rows = static_cast<std::size_t>(m_rows);
    const std::size_t fitting = lines.size() > rows ? rows - 1 : lines.size();
    std::string frame = kHome;
    for (std::size_t i = 0; i < fitting; ++i) {
        if (i > 0) frame += "\r\n";
        frame += lines[i] + kClearLine;
    }
    if (fitting < lines.size())
        frame += (fitting > 0 ? "\r\n" : "") + hiddenRows(lines.size() - fitting, m_columns) + kClearLine;
    std::cout << frame << kClearBelow << std::flush;
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
