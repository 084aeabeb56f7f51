#include "client/LineInput.h"

#include <windows.h>

#include <array>
#include <iostream>

#include "base/TextConversion.h"
#include "client/HotspotPort.h"
#include "client/Poll.h"
#include "client/StandardInput.h"
#include "client/TerminalKeys.h"
#include "client/windows/ConsoleKeys.h"

namespace vexa::client {

namespace {

constexpr wchar_t kBackspace = L'\b';
constexpr wchar_t kEnter = L'\r';

void waitForInput(Signals& signals) {
    while (true) {
        std::array<Polled, 2> watched{{{kStandardInput, kReadable}, {signals.descriptor(), kReadable}}};
        waitFor(watched, std::nullopt);
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

std::optional<std::string> readHiddenLine(Signals& signals, const std::string& prompt) {
    std::cerr << prompt << std::flush;
    return isInputTerminal() ? lineFromConsole(signals) : lineFromPipe(signals);
}

}  // namespace vexa::client
