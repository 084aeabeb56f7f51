#include "client/terminal/CharacterWidth.h"

#include <locale.h>
#include <cwchar>

namespace vexa::client {

// The C library knows the widths, but only in a locale with UTF-8.
int characterWidth(char32_t character) {
    static const locale_t locale = ::newlocale(LC_CTYPE_MASK, "C.UTF-8", nullptr);
    if (locale == nullptr) return 1;
    const locale_t before = ::uselocale(locale);
    const int width = ::wcwidth(static_cast<wchar_t>(character));
    ::uselocale(before);
    return width < 0 ? 1 : width;
}

}  // namespace vexa::client
