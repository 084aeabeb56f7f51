#pragma once

#include <cstdint>
#include <set>

#include "platform/Mutex.h"
#include "platform/WlanApi.h"

namespace vexa::simulation {

/// The open handles of the WLAN service. The value of a closed one never comes back. Any thread.
class Handles {
public:
    HANDLE open();
    bool close(HANDLE handle);
    bool isOpen(HANDLE handle) const;
    std::size_t count() const;

private:
    mutable platform::Mutex m_mutex;
    std::set<HANDLE> m_open GUARDED_BY(m_mutex);
    std::uintptr_t m_last GUARDED_BY(m_mutex) = 0;
};

}  // namespace vexa::simulation
