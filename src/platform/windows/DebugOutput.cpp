#include "platform/DebugOutput.h"

#include <windows.h>

#include <string>
#include <tuple>

#include "text/OutOfMemory.h"

namespace vexa::platform {

// What memory doesn't allow is not written.

void outputDebugString(std::string_view text) {
    std::ignore = withinMemory([&] { OutputDebugStringA(std::string(text).c_str()); });
}

void outputDebugString(std::wstring_view text) {
    std::ignore = withinMemory([&] { OutputDebugStringW(std::wstring(text).c_str()); });
}

}  // namespace vexa::platform
