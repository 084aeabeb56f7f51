#pragma once

#include <optional>

namespace vexa::client {

/// Standard output goes to a terminal, of whatever kind.
bool isOutputTerminal();

/// Standard error does.
bool isErrorTerminal();

/// Standard output goes to another process, which may read no more.
bool isOutputPipe();

/// Standard output goes to a terminal that can place a cursor.
bool canPlaceCursor();

/// It shows more than ASCII.
bool showsUtf8();

/// What stands there for the rest of a line that is too long.
inline const char* ellipsis() {
    return showsUtf8() ? "…" : "...";
}

struct TerminalSize {
    int columns;
    int rows;
};

/// Of the terminal that standard output goes to; nothing if it does not tell.
std::optional<TerminalSize> terminalSize();

}  // namespace vexa::client
