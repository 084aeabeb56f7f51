#include "platform/CodePage.h"

#include <algorithm>
#include <cstdint>
#include <iterator>

namespace vexa::platform {

// That of the simulated machine is Latin-1.
std::string inCodePage(std::wstring_view text) {
    std::string narrow;
    narrow.reserve(text.size());
    std::transform(text.begin(), text.end(), std::back_inserter(narrow), [](wchar_t unit) {
        return static_cast<std::uint32_t>(unit) > 0xFF ? '?' : static_cast<char>(unit);
    });
    return narrow;
}

}  // namespace vexa::platform
