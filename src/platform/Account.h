#pragma once

#include <optional>
#include <string>

namespace vexa::platform {

/// The account of this process, in the form DOMAIN\user; nothing if it can't be told.
std::optional<std::wstring> accountName();

}  // namespace vexa::platform
