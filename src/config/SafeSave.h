#pragma once

#include <string>
#include <string_view>

#include "platform/Files.h"

namespace vexa {

/// Writes a file so that a crash at any moment leaves the old one or the new one, whole: to a temporary file
/// in the same folder, flushed, and renamed over it. What a process that was killed left there is removed
/// first. False: the old file stands as it was; Existing::Keep also fails where there is one.
bool saveSafely(const std::wstring& path, std::string_view content,
                platform::Existing existing = platform::Existing::Replace);

}  // namespace vexa
