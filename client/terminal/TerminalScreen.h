#pragma once

#include <string>
#include <vector>

#include "client/terminal/TerminalKeys.h"

namespace vexa::client {

/// The whole terminal, for a picture that is drawn again and again. The terminal is as before once the object
/// has gone, or while it has left.
class TerminalScreen {
public:
    /// Standard output is a terminal that can place a cursor.
    static bool isUsable();

    /// The user wants colours; to be asked for terminals only.
    static bool wantsColour();

    /// The terminal shows more than ASCII.
    static bool isUtf8();

    TerminalScreen();
    ~TerminalScreen();
    TerminalScreen(const TerminalScreen&) = delete;
    TerminalScreen& operator=(const TerminalScreen&) = delete;

    void enter();
    void leave();

    /// Shows these lines in place of the ones before; what does not fit is left out.
    void draw(const std::vector<std::string>& lines);

    int columns() const { return m_columns; }
    int rows() const { return m_rows; }

    /// Asks for the size again.
    void resized();

    /// What is typed while the screen is ours.
    TerminalKeys& keys() { return m_keys; }
    const TerminalKeys& keys() const { return m_keys; }

private:
    TerminalKeys m_keys;
    bool m_entered = false;
    int m_columns = 80;
    int m_rows = 24;
};

}  // namespace vexa::client
