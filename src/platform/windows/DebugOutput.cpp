#include "platform/DebugOutput.h"

#include <windows.h>

#include <string>

namespace vexa::platform {

void outputDebugString(std::string_view text) {
    OutputDebugStringA(std::string(text).c_str());
}

void outputDebugString(std::wstring_view text) {
    OutputDebugStringW(std::wstring(text).c_str());
}

}  // namespace vexa::platform
