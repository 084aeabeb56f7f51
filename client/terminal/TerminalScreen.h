#pragma once

#include <cstddef>
#include <string>
#include <vector>

#include "client/terminal/TerminalKeys.h"

namespace vexa::client {

/// The whole terminal, for a picture that is drawn again and again. Of one that has more rows than there are
/// the heading stays and the keys move the rest.
class TerminalScreen final : public TerminalMode {
public:
    /// Standard output is a terminal that can place a cursor.
    static bool isUsable();

    /// The user wants colours; to be asked for terminals only.
    static bool wantsColour();

    /// The terminal shows more than ASCII.
    static bool isUtf8();

    TerminalScreen();
    ~TerminalScreen() override;

    void enter() override;
    void leave() override;
    void resized() override;
    int keyDescriptor() const override { return m_keys.keyDescriptor(); }
    bool takeQuit() override;

    /// Shows these lines in place of the ones before; the first `heading` of them do not move. Where they are
    /// too many, the last row says how many do not show.
    void draw(std::vector<std::string> lines, std::size_t heading);

    /// What was drawn last stands there no more, or does not fit any more.
    bool needsDrawing() const { return m_needsDrawing; }

    int columns() const { return m_columns; }
    int rows() const { return m_rows; }

private:
    /// What of the lines shows.
    struct Part {
        std::size_t heading;
        std::size_t first;
        std::size_t last;
    };

    Part shownPart() const;
    std::string hiddenRows(const Part& part) const;
    void move(Key key);
    void paint();

    TerminalKeys m_keys;
    std::vector<std::string> m_lines;
    std::size_t m_heading = 0;
    std::size_t m_moved = 0;
    bool m_entered = false;
    bool m_needsDrawing = true;
    int m_columns = 80;
    int m_rows = 24;
};

}  // namespace vexa::client
