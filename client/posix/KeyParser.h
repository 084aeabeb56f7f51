#pragma once

#include <optional>
#include <string>

#include "client/terminal/TerminalKeys.h"

namespace vexa::client {

/// Makes keys of the bytes that a terminal sends: of one for a letter, of an escape sequence for the others.
class KeyParser {
public:
    /// The key that ends with this byte; nothing if more of it has to come.
    std::optional<Key> take(char byte);

private:
    std::string m_begun;
};

}  // namespace vexa::client
