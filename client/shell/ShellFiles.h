#pragma once

#include <filesystem>
#include <string>

#include "client/shell/CommandText.h"

namespace vexa::client {

/// The completion script for this shell; empty if there is none.
std::string completionFor(const std::string& shell, const CommandText& program);

/// Writes the completion scripts and the manual pages as they lie below `/usr/share`; the script for
/// PowerShell, which has no place there, into the folder itself. Throws ClientError.
void writeShellFiles(const std::filesystem::path& folder, const CommandText& program);

}  // namespace vexa::client
