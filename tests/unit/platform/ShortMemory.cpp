#include "unit/platform/ShortMemory.h"

#include <atomic>
#include <cstdlib>
#include <new>

namespace {

std::atomic<bool (*)()> g_isWatched{nullptr};
std::atomic<bool> g_lasts{false};
std::atomic<int> g_granted{0};
std::atomic<bool> g_hasRefused{false};

bool isRefused() {
    bool (*const isWatched)() = g_isWatched;
    if (isWatched == nullptr || !isWatched() || g_granted-- > 0) return false;
    if (!g_lasts) g_isWatched = nullptr;
    return g_hasRefused = true;
}

void* allocate(std::size_t size) noexcept {
    return isRefused() ? nullptr : std::malloc(size);
}

void* allocateOrThrow(std::size_t size) {
    if (void* const memory = allocate(size)) return memory;
    throw std::bad_alloc();
}

}  // namespace

// clang-format off
void* operator new(std::size_t size) { return allocateOrThrow(size); }
void* operator new[](std::size_t size) { return allocateOrThrow(size); }
void* operator new(std::size_t size, const std::nothrow_t&) noexcept { return allocate(size); }
void* operator new[](std::size_t size, const std::nothrow_t&) noexcept { return allocate(size); }
void operator delete(void* memory) noexcept { std::free(memory); }
void operator delete[](void* memory) noexcept { std::free(memory); }
void operator delete(void* memory, std::size_t) noexcept { std::free(memory); }
void operator delete[](void* memory, std::size_t) noexcept { std::free(memory); }
// clang-format on

namespace vexa::test {

ShortMemory::ShortMemory(bool (*isWatched)(), int granted, bool lasts) {
    g_granted = granted;
    g_lasts = lasts;
    g_hasRefused = false;
    g_isWatched = isWatched;
}

ShortMemory::~ShortMemory() {
    g_isWatched = nullptr;
}

bool ShortMemory::hasRefused() const {
    return g_hasRefused;
}

void* grantedMemory(std::size_t size) noexcept {
    return allocate(size);
}

}  // namespace vexa::test
