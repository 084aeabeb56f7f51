#pragma once

#include <optional>
#include <string>
#include <string_view>

namespace vexa::client {

/// The bytes of base64 text (RFC 4648), padded; white space in it is passed over. Nothing if it is no such
/// text.
std::optional<std::string> decodeBase64(std::string_view text);

}  // namespace vexa::client
