#include "client/record/RecordingFile.h"

#include <cerrno>
#include <fstream>
#include <memory>
#include <system_error>

#include "client/terminal/ClientError.h"
#include "client/terminal/InputLine.h"
#include "client/terminal/StandardInput.h"

namespace vexa::client {

namespace fs = std::filesystem;

namespace {

ByteSource standardInput() {
    const auto signals = std::make_shared<Signals>();
    return [signals](std::span<char> buffer) {
        EventLoop loop(*signals);
        waitForInput(loop);
        return readStandardInput(buffer);
    };
}

}  // namespace

std::string recordingName(const std::string& name) {
    return name == kStandardStream ? "the recording" : name;
}

fs::path recordingPath(const std::string& name) {
    return {std::u8string(name.begin(), name.end())};
}

std::string utf8Path(const fs::path& path) {
    const std::u8string text = path.u8string();
    return {text.begin(), text.end()};
}

// What is no file, as a pipe is, has no content to lose and keeps its rights.
std::ofstream createFile(const std::string& name) {
    const fs::path path = recordingPath(name);
    std::error_code error;
    const bool isFile = !fs::exists(path, error) || fs::is_regular_file(path, error);
    if (isFile && fs::file_size(path, error) > 0 && !error)
        throw ClientError(name + " is there already, and nothing is written over another file");
    errno = 0;
    std::ofstream file(path, std::ios::binary | std::ios::app);
    if (!file) failWriting(name);
    if (isFile) fs::permissions(path, fs::perms::owner_read | fs::perms::owner_write, error);
    return file;
}

void failWriting(const std::string& name) {
    throw ClientError(recordingName(name) + " cannot be written: " + std::generic_category().message(errno));
}

ByteSource openRecording(const std::string& name) {
    if (name == kStandardStream) return standardInput();
    errno = 0;
    const auto file = std::make_shared<std::ifstream>(recordingPath(name), std::ios::binary);
    // A folder can be opened, but nothing is read from it.
    if (!*file || file->peek() == std::ifstream::traits_type::eof()) {
        throw ClientError(
            name + (errno == 0 ? " is empty" : " cannot be read: " + std::generic_category().message(errno)));
    }
    return [file](std::span<char> buffer) {
        file->read(buffer.data(), static_cast<std::streamsize>(buffer.size()));
        return static_cast<std::size_t>(file->gcount());
    };
}

}  // namespace vexa::client
