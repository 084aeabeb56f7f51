#pragma once

#include <string>
#include <vector>

#include "client/terminal/TerminalKeys.h"

namespace vexa::client {

/// The whole terminal, for a picture that is drawn again and again.
class TerminalScreen final : public TerminalMode {
public:
    /// Standard output is a terminal that can place a cursor.
    static bool isUsable();

    /// The user wants colours; to be asked for terminals only.
    static bool wantsColour();

    /// The terminal shows more than ASCII.
    static bool isUtf8();

    /// What stands for the rest of a line that is too long.
    static const char* ellipsis();

    TerminalScreen();
    ~TerminalScreen() override;

    void enter() override;
    void leave() override;
    void resized() override;
    int keyDescriptor() const override { return m_keys.keyDescriptor(); }
    bool takeQuit() override { return m_keys.takeQuit(); }

    /// Shows these lines in place of the ones before. Where they are too many, the last row says how many do
    /// not fit.
    void draw(const std::vector<std::string>& lines);

    /// What was drawn last stands there no more, or does not fit any more.
    bool needsDrawing() const { return m_needsDrawing; }

    int columns() const { return m_columns; }
    int rows() const { return m_rows; }

private:
    TerminalKeys m_keys;
    bool m_entered = false;
    bool m_needsDrawing = true;
    int m_columns = 80;
    int m_rows = 24;
};

}  // namespace vexa::client
