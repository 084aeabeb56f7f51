#include "client/terminal/ListScreen.h"

#include <algorithm>
#include <iterator>
#include <utility>

#include "client/terminal/Terminal.h"
#include "client/terminal/Text.h"

namespace vexa::client {

void ListScreen::show(std::vector<std::string> lines, std::size_t heading) {
    m_lines = std::move(lines);
    m_heading = heading;
    draw();
}

void ListScreen::enter() {
    m_screen.enter();
    draw();
}

void ListScreen::resized() {
    m_screen.resized();
    draw();
}

void ListScreen::draw() {
    std::vector<std::string> lines;
    std::transform(
        m_lines.begin(), m_lines.end(), std::back_inserter(lines),
        [this](const std::string& line) { return cutToColumns(line, m_screen.columns(), ellipsis()); });
    m_screen.draw(std::move(lines), m_heading);
}

}  // namespace vexa::client
