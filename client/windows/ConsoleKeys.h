#pragma once

#include <optional>

namespace vexa::client {

// Keys of a console. Its input holds more than keys: a window that was resized, a mouse that was moved. What
// is no key is taken away here; a new size is told as a signal.

/// A key that was pressed: its character, 0 for one that moves a cursor or a view, and the system's own
/// number.
struct ConsoleKey {
    wchar_t character;
    unsigned short code;
};

bool isKeyWaiting();

/// The oldest key.
std::optional<ConsoleKey> takeKey();

}  // namespace vexa::client
