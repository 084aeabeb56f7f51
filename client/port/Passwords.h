#pragma once

namespace vexa::client {

/// Whether what is printed tells the passwords of credentials.
enum class Passwords { Hidden, Shown };

/// Stands in the place of one that is hidden.
inline constexpr const char* kHiddenPassword = "********";

}  // namespace vexa::client
