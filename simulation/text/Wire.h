#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <span>
#include <type_traits>

#include "simulation/text/Text.h"

namespace vexa::simulation {

// Little-endian fields of messages, at any offset. The block must be long enough.

inline std::uint32_t loadU32(std::span<const std::uint8_t> block, std::size_t at) {
    return block[at] | std::uint32_t{block[at + 1]} << 8 | std::uint32_t{block[at + 2]} << 16 |
           std::uint32_t{block[at + 3]} << 24;
}

inline void storeU16(std::span<std::uint8_t> block, std::size_t at, std::uint16_t value) {
    block[at] = static_cast<std::uint8_t>(value & 0xFF);
    block[at + 1] = static_cast<std::uint8_t>(value >> 8);
}

inline void storeU32(std::span<std::uint8_t> block, std::size_t at, std::uint32_t value) {
    storeU16(block, at, static_cast<std::uint16_t>(value & 0xFFFF));
    storeU16(block, at + 2, static_cast<std::uint16_t>(value >> 16));
}

/// The bytes of a structure as they stand in memory.
template <class T>
Bytes bytesOf(const T& structure) {
    static_assert(std::is_trivially_copyable_v<T>);
    Bytes bytes(sizeof structure);
    std::memcpy(bytes.data(), &structure, sizeof structure);
    return bytes;
}

}  // namespace vexa::simulation
