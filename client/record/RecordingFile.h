#pragma once

#include <cstddef>
#include <filesystem>
#include <fstream>
#include <functional>
#include <span>
#include <string>

namespace vexa::client {

/// The name under which a recording is on standard input or output.
inline constexpr const char* kStandardStream = "-";

/// How a recording is called in a sentence.
std::string recordingName(const std::string& name);

/// Its path; names are UTF-8.
std::filesystem::path recordingPath(const std::string& name);

/// The path as such a name.
std::string utf8Path(const std::filesystem::path& path);

/// A new file for its owner alone, or one that is empty, or a pipe and the like as it is. Throws ClientError
/// if there is another file.
std::ofstream createFile(const std::string& name);

/// Throws ClientError with the reason in errno.
[[noreturn]] void failWriting(const std::string& name);

/// Gives the next bytes of something that is read; none at its end.
using ByteSource = std::function<std::size_t(std::span<char> buffer)>;

/// The file, or standard input, where Ctrl-C ends the wait by StoppedByUser. Throws ClientError if there is
/// no such file.
ByteSource openRecording(const std::string& name);

}  // namespace vexa::client
