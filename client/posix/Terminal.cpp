#include "client/terminal/Terminal.h"

#include <sys/ioctl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cctype>
#include <cstdlib>
#include <string>
#include <string_view>

namespace vexa::client {

namespace {

std::string_view variable(const char* name) {
    const char* value = std::getenv(name);
    return value == nullptr ? "" : value;
}

}  // namespace

bool isOutputTerminal() {
    return ::isatty(STDOUT_FILENO) != 0;
}

bool isErrorTerminal() {
    return ::isatty(STDERR_FILENO) != 0;
}

bool isOutputPipe() {
    struct stat status {};
    return ::fstat(STDOUT_FILENO, &status) == 0 && (S_ISFIFO(status.st_mode) || S_ISSOCK(status.st_mode));
}

bool canPlaceCursor() {
    const std::string_view terminal = variable("TERM");
    return isOutputTerminal() && !terminal.empty() && terminal != "dumb";
}

bool showsUtf8() {
    for (const char* name : {"LC_ALL", "LC_CTYPE", "LANG"}) {
        std::string value(variable(name));
        if (value.empty()) continue;
        std::transform(value.begin(), value.end(), value.begin(),
                       [](unsigned char c) { return static_cast<char>(std::toupper(c)); });
        return value.find("UTF-8") != std::string::npos || value.find("UTF8") != std::string::npos;
    }
    return false;
}

std::optional<TerminalSize> terminalSize() {
    winsize size{};
    if (::ioctl(STDOUT_FILENO, TIOCGWINSZ, &size) != 0 || size.ws_col == 0 || size.ws_row == 0)
        return std::nullopt;
    return TerminalSize{size.ws_col, size.ws_row};
}

}  // namespace vexa::client
