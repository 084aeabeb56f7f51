#pragma once

#include <cstddef>

namespace vexa::test {

/// While one lives, memory is short on the threads for which `isWatched` holds: so many requests are granted,
/// then one is refused, or all are if it `lasts`. A program with this has an operator new of its own.
class ShortMemory {
public:
    ShortMemory(bool (*isWatched)(), int granted, bool lasts);
    ~ShortMemory();
    ShortMemory(const ShortMemory&) = delete;
    ShortMemory& operator=(const ShortMemory&) = delete;

    bool hasRefused() const;
};

/// What operator new gives; null if it is refused. For libraries that can be told where to ask.
void* grantedMemory(std::size_t size) noexcept;

}  // namespace vexa::test
