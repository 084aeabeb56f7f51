#pragma once

#include <new>
#include <utility>

namespace vexa {

/// Does the work as far as memory allows. False: memory ran out, and the work ended there. What a thread is
/// woken for goes through this, so that it lives on.
template <class Work>
[[nodiscard]] bool withinMemory(Work&& work) {
    try {
        std::forward<Work>(work)();
        return true;
    } catch (const std::bad_alloc&) {
        return false;
    }
}

}  // namespace vexa
