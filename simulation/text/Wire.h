#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <span>
#include <type_traits>

#include "simulation/text/Text.h"
#include "text/LittleEndian.h"

namespace vexa::simulation {

// Little-endian fields of messages, at any offset. The block must be long enough.

inline std::uint32_t loadU32(std::span<const std::uint8_t> block, std::size_t at) {
    return readLittleEndian<std::uint32_t>(std::as_bytes(block), at);
}

inline void storeU16(std::span<std::uint8_t> block, std::size_t at, std::uint16_t value) {
    writeLittleEndian(std::as_writable_bytes(block), at, value);
}

inline void storeU32(std::span<std::uint8_t> block, std::size_t at, std::uint32_t value) {
    writeLittleEndian(std::as_writable_bytes(block), at, value);
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
