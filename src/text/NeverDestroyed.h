#pragma once

#include <cstddef>
#include <memory>
#include <utility>

namespace vexa {

/// A static object that a thread may still touch while the process ends: built like any other, never
/// destroyed.
template <class T>
class NeverDestroyed {
public:
    template <class... Args>
    explicit NeverDestroyed(Args&&... args)
        : m_object(std::construct_at(reinterpret_cast<T*>(m_storage), std::forward<Args>(args)...)) {}
    NeverDestroyed(const NeverDestroyed&) = delete;
    NeverDestroyed& operator=(const NeverDestroyed&) = delete;

    T& get() { return *m_object; }

private:
    alignas(T) std::byte m_storage[sizeof(T)];
    T* m_object;
};

}  // namespace vexa
