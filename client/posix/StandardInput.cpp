#include "client/StandardInput.h"

#include <unistd.h>

#include <cerrno>

namespace vexa::client {

bool isInputTerminal() {
    return ::isatty(STDIN_FILENO) != 0;
}

std::size_t readStandardInput(std::span<char> buffer) {
    while (true) {
        const ssize_t count = ::read(STDIN_FILENO, buffer.data(), buffer.size());
        if (count >= 0) return static_cast<std::size_t>(count);
        if (errno != EINTR && errno != EAGAIN) return 0;
    }
}

}  // namespace vexa::client
