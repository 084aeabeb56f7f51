#pragma once

#include <filesystem>
#include <string>

namespace vexa::client {

/// Puts the text in place of the file's content, all or nothing; the file is for the owner only. False if it
/// cannot be written.
bool replaceOwnerFile(const std::filesystem::path& file, const std::string& text);

}  // namespace vexa::client
