#pragma once

#include <string_view>

namespace vexa::client {

inline constexpr int kHighestLevel = 6;

/// The level at which the service has logged this text, as the log itself does not tell it: known by the
/// text's beginning. What is not known is of the normal trace.
int levelOfText(std::string_view text);

}  // namespace vexa::client
