#pragma once

#include <string>
#include <vector>

#include "client/terminal/TerminalScreen.h"

namespace vexa::client {

/// The whole terminal for a list, which is drawn anew when it is another one, when the window has another
/// size, and when the process goes on. The lines are printable and without colours.
class ListScreen final : public TerminalMode {
public:
    void show(std::vector<std::string> lines);

    void enter() override;
    void leave() override { m_screen.leave(); }
    void resized() override;
    int keyDescriptor() const override { return m_screen.keyDescriptor(); }
    bool takeQuit() override { return m_screen.takeQuit(); }

private:
    void draw();

    TerminalScreen m_screen;
    std::vector<std::string> m_lines;
};

}  // namespace vexa::client
