#pragma once

#include <string>
#include <string_view>

#include "platform/WlanApi.h"

namespace vexa {

/// "{XXXXXXXX-XXXX-XXXX-XXXX-XXXXXXXXXXXX}", upper case.
std::string guidToString(const GUID& guid);

/// 0 if `text` is the text of the GUID in either case.
int compareGuidText(std::string_view text, const GUID& guid);

/// All 16 bytes.
bool areGuidsEqual(const GUID& a, const GUID& b);

}  // namespace vexa
