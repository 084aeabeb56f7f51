#include "client/terminal/InputLine.h"

#include <array>

#include "client/terminal/ClientError.h"
#include "client/terminal/StandardInput.h"

namespace vexa::client {

void waitForInput(EventLoop& loop) {
    Polled input{kStandardInput, kReadable};
    while (input.happened == 0) {
        if (!loop.wait(std::span(&input, 1), Deadline::never()))
            throw StoppedByUser("stopped before anything was changed");
    }
}

std::optional<std::string> readLine(EventLoop& loop) {
    std::string line;
    while (true) {
        waitForInput(loop);
        char next = 0;
        const bool isEnd = readStandardInput({&next, 1}) == 0;
        if (isEnd && line.empty()) return std::nullopt;
        if (isEnd || next == '\n') break;
        line += next;
    }
    if (line.ends_with('\r')) line.pop_back();
    return line;
}

std::string readToEnd(EventLoop& loop) {
    std::string text;
    std::array<char, 4096> buffer{};
    while (true) {
        waitForInput(loop);
        const std::size_t count = readStandardInput(buffer);
        if (count == 0) return text;
        text.append(buffer.data(), count);
    }
}

}  // namespace vexa::client
