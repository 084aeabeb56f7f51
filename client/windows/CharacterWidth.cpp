#include "client/terminal/CharacterWidth.h"

#include <algorithm>
#include <iterator>

namespace vexa::client {

namespace {

struct Range {
    char32_t first;
    char32_t last;
    int width;
};

// What differs from 1, in ascending order: marks that combine with what stands before them, and the scripts
// that fill a square. No call of the operating system tells what its consoles do.
constexpr Range kRanges[] = {
    {0x0300, 0x036F, 0},   {0x0483, 0x0489, 0},   {0x0591, 0x05BD, 0},   {0x0610, 0x061A, 0},
    {0x064B, 0x065F, 0},   {0x0E31, 0x0E31, 0},   {0x0E34, 0x0E3A, 0},   {0x0E47, 0x0E4E, 0},
    {0x1100, 0x115F, 2},   {0x200B, 0x200F, 0},   {0x202A, 0x202E, 0},   {0x20D0, 0x20F0, 0},
    {0x2E80, 0x303E, 2},   {0x3041, 0x4DBF, 2},   {0x4E00, 0xA4CF, 2},   {0xA960, 0xA97C, 2},
    {0xAC00, 0xD7A3, 2},   {0xF900, 0xFAFF, 2},   {0xFE00, 0xFE0F, 0},   {0xFE20, 0xFE2F, 0},
    {0xFE30, 0xFE6F, 2},   {0xFF01, 0xFF60, 2},   {0xFFE0, 0xFFE6, 2},   {0x1F300, 0x1F64F, 2},
    {0x1F680, 0x1F6FF, 2}, {0x1F900, 0x1F9FF, 2}, {0x20000, 0x3FFFD, 2},
};

}  // namespace

int characterWidth(char32_t character) {
    const auto* const range =
        std::find_if(std::begin(kRanges), std::end(kRanges),
                     [character](const Range& candidate) { return character <= candidate.last; });
    return range != std::end(kRanges) && character >= range->first ? range->width : 1;
}

}  // namespace vexa::client
