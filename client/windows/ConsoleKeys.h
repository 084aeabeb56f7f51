#pragma once

#include <optional>

namespace vexa::client {

// Keys of a console. Its input holds more than keys: a window that was resized, a mouse that was moved. What
// is no key is taken away here; a new size is told as a signal.

bool isKeyWaiting();

/// The character of the oldest key that has one.
std::optional<wchar_t> takeKey();

}  // namespace vexa::client
