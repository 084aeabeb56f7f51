#include "simulation/parts/Handles.h"

namespace vexa::simulation {

using platform::LockGuard;
using platform::Mutex;

HANDLE Handles::open() {
    const LockGuard<Mutex> lock(m_mutex);
    m_last += 4;                                      // as the operating system numbers its handles
    auto* handle = reinterpret_cast<HANDLE>(m_last);  // NOLINT(performance-no-int-to-ptr)
    m_open.insert(handle);
    return handle;
}

bool Handles::close(HANDLE handle) {
    const LockGuard<Mutex> lock(m_mutex);
    return m_open.erase(handle) > 0;
}

bool Handles::isOpen(HANDLE handle) const {
    const LockGuard<Mutex> lock(m_mutex);
    return m_open.count(handle) > 0;
}

std::size_t Handles::count() const {
    const LockGuard<Mutex> lock(m_mutex);
    return m_open.size();
}

}  // namespace vexa::simulation
