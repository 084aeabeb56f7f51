#include "platform/Guid.h"

#include <cstdio>
#include <cstring>

#include "text/TextConversion.h"

namespace vexa {

std::string guidToString(const GUID& guid) {
    char text[39];
    const auto& d = guid.Data4;
    std::snprintf(text, sizeof text, "{%08X-%04X-%04X-%02X%02X-%02X%02X%02X%02X%02X%02X}",
                  static_cast<unsigned>(guid.Data1), static_cast<unsigned>(guid.Data2),
                  static_cast<unsigned>(guid.Data3), d[0], d[1], d[2], d[3], d[4], d[5], d[6], d[7]);
    return text;
}

int compareGuidText(std::string_view text, const GUID& guid) {
    return compareNoCase(text, guidToString(guid));
}

bool areGuidsEqual(const GUID& a, const GUID& b) {
    return std::memcmp(&a, &b, sizeof(GUID)) == 0;
}

}  // namespace vexa
