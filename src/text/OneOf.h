#pragma once

#include <algorithm>
#include <iterator>
#include <string_view>

namespace vexa {

/// Whether a text is one of a range of texts, of whatever type.
template <class Texts>
bool isOneOf(const Texts& texts, std::string_view text) {
    return std::ranges::find(texts, text) != std::ranges::end(texts);
}

}  // namespace vexa
