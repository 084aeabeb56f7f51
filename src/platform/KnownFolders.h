#pragma once

#include <optional>
#include <string>

namespace vexa::platform {

/// The folder that all users of the machine share, without a backslash at its end; nothing if it is unknown.
std::optional<std::wstring> publicFolder();

}  // namespace vexa::platform
