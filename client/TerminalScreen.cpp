#include "client/TerminalScreen.h"

#include <sys/ioctl.h>
#include <unistd.h>

#include <algorithm>
#include <cctype>
#include <cstdlib>
#include <iostream>
#include <string_view>

namespace vexa::client {

namespace {

constexpr const char* kEnter = "\033[?1049h\033[?25l\033[?7l\033[2J";
constexpr const char* kLeave = "\033[?7h\033[?25h\033[?1049l";
constexpr const char* kHome = "\033[H";
constexpr const char* kClearLine = "\033[K";
constexpr const char* kClearBelow = "\033[J";

std::string_view variable(const char* name) {
    const char* value = std::getenv(name);
    return value == nullptr ? "" : value;
}

}  // namespace

bool TerminalScreen::isUsable() {
    const std::string_view terminal = variable("TERM");
    return ::isatty(STDOUT_FILENO) != 0 && !terminal.empty() && terminal != "dumb";
}

bool TerminalScreen::wantsColour() {
    return variable("NO_COLOR").empty();
}

bool TerminalScreen::isUtf8() {
    for (const char* name : {"LC_ALL", "LC_CTYPE", "LANG"}) {
        std::string value(variable(name));
        if (value.empty()) continue;
        std::transform(value.begin(), value.end(), value.begin(),
                       [](unsigned char c) { return static_cast<char>(std::toupper(c)); });
        return value.find("UTF-8") != std::string::npos || value.find("UTF8") != std::string::npos;
    }
    return false;
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
    const std::size_t fitting = std::min(lines.size(), static_cast<std::size_t>(m_rows));
    std::string frame = kHome;
    for (std::size_t i = 0; i < fitting; ++i) {
        if (i > 0) frame += "\r\n";
        frame += lines[i] + kClearLine;
    }
    std::cout << frame << kClearBelow << std::flush;
}

void TerminalScreen::resized() {
    winsize size{};
    if (::ioctl(STDOUT_FILENO, TIOCGWINSZ, &size) != 0 || size.ws_col == 0 || size.ws_row == 0) return;
    m_columns = size.ws_col;
    m_rows = size.ws_row;
}

}  // namespace vexa::client
