#include "client/StandardInput.h"

#include <windows.h>

#include "client/windows/ConsoleKeys.h"
#include "client/windows/InputReader.h"

namespace vexa::client {

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

}  // namespace vexa::client
