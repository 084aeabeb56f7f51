#include "client/terminal/StandardInput.h"

#include <windows.h>

#include <array>
#include <iostream>

#include "client/terminal/ClientError.h"
#include "client/terminal/Poll.h"
#include "client/terminal/TerminalKeys.h"
#include "client/windows/ConsoleKeys.h"
#include "client/windows/InputReader.h"
#include "text/TextConversion.h"

namespace vexa::client {

namespace {

constexpr wchar_t kBackspace = L'\b';
constexpr wchar_t kEnter = L'\r';

void waitForInput(Signals& signals) {
    while (true) {
        std::array<Polled, 2> watched{{{kStandardInput, kReadable}, {signals.descriptor(), kReadable}}};
        waitFor(watched, Deadline::never());
        while (const auto signal = signals.take())
            if (Signals::isStop(*signal)) throw StoppedByUser("stopped before anything was changed");
        if (watched[0].happened != 0) return;
    }
}

std::string lineFromConsole(Signals& signals) {
    const TerminalKeys withoutEcho;
    std::wstring line;
    while (true) {
        waitForInput(signals);
        const auto key = takeKey();
        if (!key) continue;
        if (*key == kEnter) return utf8FromWide(line);
        if (*key != kBackspace)
            line += *key;
        else if (!line.empty())
            line.pop_back();
    }
}

std::optional<std::string> lineFromPipe(Signals& signals) {
    std::string line;
    while (true) {
        waitForInput(signals);
        char next = 0;
        const bool isEnd = readStandardInput({&next, 1}) == 0;
        if (isEnd && line.empty()) return std::nullopt;
        if (isEnd || next == '\n') break;
        line += next;
    }
    if (line.ends_with('\r')) line.pop_back();
    return line;
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
    buffer[0] = key && *key < 0x80 ? static_cast<char>(*key) : '?';
    return 1;
}

std::optional<std::string> readHiddenLine(Signals& signals, const std::string& prompt) {
    std::cerr << prompt << std::flush;
    return isInputTerminal() ? lineFromConsole(signals) : lineFromPipe(signals);
}

}  // namespace vexa::client
