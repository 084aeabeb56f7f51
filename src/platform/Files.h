#pragma once

#include <string>
#include <string_view>

namespace vexa::platform {

/// Appends to a text file, opened and closed by each call; a new file is readable by its owner only. The path
/// is in the narrow code page. False: it can't be opened, and nothing was written.
bool appendToFile(const std::string& narrowPath, std::string_view text);

}  // namespace vexa::platform
