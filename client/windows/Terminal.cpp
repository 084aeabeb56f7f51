#include "client/terminal/Terminal.h"

#include <windows.h>

#include <cstdlib>
#include <string_view>

namespace vexa::client {

namespace {

bool isConsole(DWORD stream) {
    DWORD mode = 0;
    return GetConsoleMode(GetStdHandle(stream), &mode) != 0;
}

}  // namespace

bool isOutputTerminal() {
    return isConsole(STD_OUTPUT_HANDLE);
}

bool isErrorTerminal() {
    return isConsole(STD_ERROR_HANDLE);
}

bool isOutputPipe() {
    return GetFileType(GetStdHandle(STD_OUTPUT_HANDLE)) == FILE_TYPE_PIPE;
}

// The entry has asked for it.
bool canPlaceCursor() {
    const char* const terminal = std::getenv("TERM");
    if (terminal != nullptr && std::string_view(terminal) == "dumb") return false;
    DWORD mode = 0;
    return GetConsoleMode(GetStdHandle(STD_OUTPUT_HANDLE), &mode) != 0 &&
           (mode & ENABLE_VIRTUAL_TERMINAL_PROCESSING) != 0;
}

// The entry writes characters to a console, whatever its code page.
bool showsUtf8() {
    return isOutputTerminal();
}

std::optional<TerminalSize> terminalSize() {
    CONSOLE_SCREEN_BUFFER_INFO info{};
    if (GetConsoleScreenBufferInfo(GetStdHandle(STD_OUTPUT_HANDLE), &info) == 0) return std::nullopt;
    const SMALL_RECT& window = info.srWindow;
    return TerminalSize{window.Right - window.Left + 1, window.Bottom - window.Top + 1};
}

}  // namespace vexa::client
