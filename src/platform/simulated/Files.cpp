#include "platform/Files.h"

#include <fcntl.h>
#include <unistd.h>

namespace vexa::platform {

namespace {

constexpr mode_t kOwnerOnly = 0600;

// Narrow file names are Latin-1, those of the host UTF-8.
std::string hostPath(const std::string& narrowPath) {
    std::string path;
    for (const char c : narrowPath) {
        const auto byte = static_cast<unsigned char>(c);
        if (byte < 0x80) {
            path += c;
        } else {
            path += static_cast<char>(0xC0 | (byte >> 6));
            path += static_cast<char>(0x80 | (byte & 0x3F));
        }
    }
    return path;
}

}  // namespace

bool appendToFile(const std::string& narrowPath, std::string_view text) {
    const int file =
        open(hostPath(narrowPath).c_str(), O_WRONLY | O_CREAT | O_APPEND | O_CLOEXEC, kOwnerOnly);
    if (file < 0) return false;
    while (!text.empty()) {
        const ssize_t written = write(file, text.data(), text.size());
        if (written <= 0) break;
        text.remove_prefix(static_cast<std::size_t>(written));
    }
    close(file);
    return true;
}

}  // namespace vexa::platform
