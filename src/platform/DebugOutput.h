#pragma once

#include <string_view>

namespace vexa::platform {

/// A line for an attached debugger. Never fails, never blocks for long.
void outputDebugString(std::string_view text);
void outputDebugString(std::wstring_view text);

}  // namespace vexa::platform
