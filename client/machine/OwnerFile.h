#pragma once

#include <filesystem>
#include <string>

namespace vexa::client {

/// Puts the text in place of the file's content, all or nothing; the file is for the owner only. False if it
/// cannot be written.
bool replaceOwnerFile(const std::filesystem::path& file, const std::string& text);

/// A new file with this text, readable by its owner only wherever it stands; nothing is left of it if it
/// cannot be written. Throws ClientError, also where there is one already, or a link of the name.
void createOwnerFile(const std::filesystem::path& file, const std::string& text);

}  // namespace vexa::client
