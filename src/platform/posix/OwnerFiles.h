#pragma once

#include <filesystem>
#include <optional>
#include <string>
#include <string_view>

namespace vexa::posix {

// Files that only their owner may read, as all in the folder of a machine.

/// Creates the folder and those above it that are missing. False if that can't be done; errno says why.
bool createOwnerFolder(const std::filesystem::path& folder);

/// Nothing if it can't be read.
std::optional<std::string> readFile(const std::filesystem::path& path);

/// Leaves the old content or the new one, whole. Creates the folder at need.
bool replaceFile(const std::filesystem::path& path, std::string_view content);

/// Adds the text with one write, so that what several threads and processes add doesn't mix. Creates the
/// folder at need.
bool appendToFile(const std::filesystem::path& path, std::string_view text);

}  // namespace vexa::posix
