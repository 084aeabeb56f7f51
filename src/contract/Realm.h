#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>

namespace vexa::contract {

/// How many bytes of a text of a credential are compared with what a network announces; a longer one fits
/// none.
inline constexpr std::size_t kMostMatchedBytes = 255;

/// The bytes in which a credential's realm is compared with those that a network announces. Nothing if it
/// fits no network at all: it can't be told in Latin-1, or is too long.
std::optional<std::string> realmBytes(std::wstring_view realm);

}  // namespace vexa::contract
