#pragma once

#include <string>
#include <string_view>

namespace vexa::client {

/// The bytes of the SSID that the service lists under this name, up to a NUL.
std::string ssidOfName(std::string_view name);

/// It can stand as a text where the scenario wants one.
bool isTextSsid(std::string_view ssid);

/// In lower case, without separators.
std::string hexOf(std::string_view bytes);

}  // namespace vexa::client
