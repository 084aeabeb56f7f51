#pragma once

#include <cstddef>
#include <cstdlib>
#include <cstring>

namespace vexa::simulation {

/// Memory that a caller of the WLAN service gives back through WlanFreeMemory: a copy of `size` bytes, and
/// not one more. The interface hands it over without an owner.
// NOLINTBEGIN(cppcoreguidelines-no-malloc, cppcoreguidelines-owning-memory)
inline void* memoryForCaller(const void* content, std::size_t size) {
    void* memory = std::malloc(size);
    if (memory) std::memcpy(memory, content, size);
    return memory;
}

inline void freeCallersMemory(void* memory) {
    std::free(memory);
}
// NOLINTEND(cppcoreguidelines-no-malloc, cppcoreguidelines-owning-memory)

}  // namespace vexa::simulation
