#pragma once

#include <cstddef>
#include <cstdint>
#include <span>

namespace vexa {

using Bytes = std::span<const std::byte>;

/// A number at any offset of a message, aligned or not. REQUIRES: it lies within the bytes.
template <class Integer>
Integer readLittleEndian(Bytes bytes, std::size_t offset) {
    std::uint64_t value = 0;
    for (std::size_t i = sizeof(Integer); i-- > 0;)
        value = value << 8 | std::to_integer<std::uint64_t>(bytes[offset + i]);
    return static_cast<Integer>(value);
}

template <class Integer>
void writeLittleEndian(std::span<std::byte> bytes, std::size_t offset, Integer number) {
    auto value = static_cast<std::uint64_t>(number);
    for (std::size_t i = 0; i < sizeof(Integer); ++i, value >>= 8)
        bytes[offset + i] = static_cast<std::byte>(value & 0xFF);
}

}  // namespace vexa
