#pragma once

#include <termios.h>

#include <optional>
#include <string>
#include <vector>

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

    /// Asks for the size again.
    void resized();

    /// Where keys come from: a descriptor to poll, or -1 if standard input is no terminal.
    int keyDescriptor() const { return m_keys ? 0 : -1; }

    /// A key that was pressed, or nothing. To be called when the descriptor is readable.
    std::optional<char> takeKey();

private:
    std::optional<termios> m_before;
    bool m_entered = false;
    bool m_keys = false;
    int m_columns = 80;
    int m_rows = 24;
};

}  // namespace vexa::client
