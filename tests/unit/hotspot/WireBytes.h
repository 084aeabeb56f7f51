#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

#include "text/LittleEndian.h"

namespace vexa::test {

/// A block on the heap of exactly its size, so that a read behind it is a sanitizer's report.
using Block = std::vector<std::byte>;

/// Hexadecimal digits to bytes, and back in lower case; blanks are passed over.
Block bytesOfHex(std::string_view hex);
std::string hexOf(Bytes bytes);

Block bytesOfText(std::string_view text);

Block operator+(Block left, const Block& right);

/// Pieces of an ANQP NAI Realm list, well-formed whatever they hold.
Block authParameter(unsigned id, const Block& value);
Block eapMethod(unsigned method, const std::vector<Block>& parameters = {});
Block realmData(std::string_view names, const std::vector<Block>& methods);
Block realmList(const std::vector<Block>& entries);

/// One BSS as the module describes it.
Block bssRecord(std::string_view macHex, std::string_view ssid, unsigned isHs20 = 1, unsigned networkType = 2,
                unsigned internetAccess = 1);

}  // namespace vexa::test
