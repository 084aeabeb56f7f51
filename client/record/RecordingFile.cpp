#include "client/record/RecordingFile.h"

#include <cerrno>
#include <fstream>
#include <memory>
#include <system_error>

#include "client/terminal/ClientError.h"
#include "client/terminal/InputLine.h"
#include "client/terminal/StandardInput.h"

namespace vexa::client {

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

std::filesystem::path recordingPath(const std::string& name) {
    return {std::u8string(name.begin(), name.end())};
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
