#pragma once

namespace vexa::client {

/// A character that shows nothing of itself and may change how all around it is shown: a control character,
/// one that only formats, an end of a line, or one that has no meaning yet and is left out until it has.
bool isHidden(char32_t character);

}  // namespace vexa::client
