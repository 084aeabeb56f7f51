#pragma once

#include <cstddef>
#include <string>
#include <vector>

#include "client/terminal/TerminalScreen.h"

namespace vexa::client {

/// The whole terminal for a list with a heading, which is drawn anew when it is another one, when the window
/// has another size, and when the process goes on. The lines are printable and without colours.
class ListScreen final : public TerminalMode {
public:
    void show(std::vector<std::string> lines, std::size_t heading);

    void enter() override;
    void leave() override { m_screen.leave(); }
    void resized() override;
    int keyDescriptor() const override { return m_screen.keyDescriptor(); }
    bool takeQuit() override { return m_screen.takeQuit(); }

private:
    void draw();

    TerminalScreen m_screen;
    std::vector<std::string> m_lines;
    std::size_t m_heading = 0;
};

}  // namespace vexa::client
