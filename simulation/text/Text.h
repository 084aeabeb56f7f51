#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace vexa::simulation {

// Conversions between the text of scenarios, which is UTF-8, and that of the machine.

using Bytes = std::vector<std::uint8_t>;

/// The code points of UTF-8 text. A byte that belongs to no valid sequence stands for itself.
std::u32string codePoints(std::string_view utf8);

std::u16string utf16(std::string_view utf8);

/// One byte for each code point, "?" for those above U+00FF.
std::string latin1(std::string_view utf8);

/// Bytes that are meant to be UTF-8, such as an SSID, as text that is.
std::string textOfBytes(std::span<const std::uint8_t> bytes);

/// Lower case, without separators.
std::string hexText(std::span<const std::uint8_t> bytes);

/// Reads either case; nothing if it is no even number of hex digits.
std::optional<Bytes> bytesFromHex(std::string_view hex);

/// ASCII letters count as equal in either case.
bool startsWithNoCase(std::string_view text, std::string_view prefix);

}  // namespace vexa::simulation
