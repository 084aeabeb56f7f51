#include "client/terminal/StandardInput.h"

#include <windows.h>

#include <iostream>

#include "client/terminal/InputLine.h"
#include "client/terminal/TerminalKeys.h"
#include "client/windows/ConsoleKeys.h"
#include "client/windows/InputReader.h"
#include "text/TextConversion.h"

namespace vexa::client {

namespace {

constexpr wchar_t kBackspace = L'\b';
constexpr wchar_t kEnter = L'\r';

std::string lineFromConsole(EventLoop& loop) {
    const TerminalKeys withoutEcho;
    std::wstring line;
    while (true) {
        waitForInput(loop);
        const auto key = takeKey();
        if (!key || key->character == L'\0') continue;
        if (key->character == kEnter) return utf8FromWide(line);
        if (key->character != kBackspace)
            line += key->character;
        else if (!line.empty())
            line.pop_back();
    }
}

}  // namespace

bool isInputTerminal() {
    DWORD mode = 0;
    return GetConsoleMode(GetStdHandle(STD_INPUT_HANDLE), &mode) != 0;
}

// Whoever waits for the end of the input gets none from a console: there Ctrl-C ends the wait.
std::size_t readStandardInput(std::span<char> buffer) {
    if (!isInputTerminal()) return readInput(buffer);
    const auto key = takeKey();
    buffer[0] = key && key->character != 0 && key->character < 0x80 ? static_cast<char>(key->character) : '?';
    return 1;
}

std::optional<std::string> readHiddenLine(Signals& signals, const std::string& prompt) {
    std::cerr << prompt << std::flush;
    EventLoop loop(signals);
    return isInputTerminal() ? lineFromConsole(loop) : readLine(loop);
}

}  // namespace vexa::client
