#pragma once

namespace vexa::client {

/// How many columns of a terminal a printable character takes: 0, 1 or 2.
int characterWidth(char32_t character);

}  // namespace vexa::client
