#pragma once

#include <string>
#include <string_view>

namespace vexa {

/// The text under which clients know an SSID: its UTF-8 as it stands, and a byte that is none as `\xE9`. A
/// backslash that would read like such a byte is written so, too: no two SSIDs are shown as the same.
std::string shownName(std::string_view ssid);

}  // namespace vexa
