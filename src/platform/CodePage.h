#pragma once

#include <string>
#include <string_view>

namespace vexa::platform {

/// A text in the machine's default code page, with a question mark for a character that the code page lacks.
std::string inCodePage(std::wstring_view text);

}  // namespace vexa::platform
