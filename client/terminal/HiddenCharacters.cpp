#include "client/terminal/HiddenCharacters.h"

#include <algorithm>
#include <iterator>

namespace vexa::client {

namespace {

struct Range {
    char32_t first;
    char32_t last;
};

// In ascending order. Variation selectors are not among them: they follow what they belong to.
constexpr Range kRanges[] = {
    {0x0000, 0x001F},   {0x007F, 0x009F},   {0x00AD, 0x00AD},   {0x034F, 0x034F},   {0x0600, 0x0605},
    {0x061C, 0x061C},   {0x06DD, 0x06DD},   {0x070F, 0x070F},   {0x0890, 0x0891},   {0x08E2, 0x08E2},
    {0x115F, 0x1160},   {0x17B4, 0x17B5},   {0x180E, 0x180E},   {0x200B, 0x200F},   {0x2028, 0x202E},
    {0x2060, 0x206F},   {0x3164, 0x3164},   {0xFEFF, 0xFEFF},   {0xFFA0, 0xFFA0},   {0xFFF0, 0xFFFB},
    {0x110BD, 0x110BD}, {0x110CD, 0x110CD}, {0x13430, 0x1343F}, {0x1BCA0, 0x1BCA3}, {0x1D173, 0x1D17A},
    {0xE0000, 0xE0FFF},
};

}  // namespace

bool isHidden(char32_t character) {
    const auto* const range =
        std::find_if(std::begin(kRanges), std::end(kRanges),
                     [character](const Range& candidate) { return character <= candidate.last; });
    return range != std::end(kRanges) && character >= range->first;
}

}  // namespace vexa::client
