#pragma once

#include <optional>

#include "platform/Mutex.h"
#include "platform/WlanApi.h"

namespace vexa {

/// Whether an interface of the maker exists. If so `interfaceGuid` gets its GUID, else it stays untouched, so
/// that its holder keeps the last adapter seen. With two of them the first in the WLAN service's list counts.
/// A failed query reads as absent. Asks the registry anew on every call.
bool isAdapterPresent(HANDLE hWlan, GUID& interfaceGuid);

/// The same through a WLAN handle that is opened and closed for it; nothing if it can't be opened or no
/// adapter is present.
std::optional<GUID> presentAdapter();

/// Whether the registry names the maker's hardware for this interface.
bool isVendorInterface(const GUID& guid);

/// A GUID that several threads read and write.
class SharedGuid {
public:
    GUID get() const {
        const platform::LockGuard lock(m_mutex);
        return m_guid;
    }
    void set(const GUID& guid) {
        const platform::LockGuard lock(m_mutex);
        m_guid = guid;
    }

    /// isAdapterPresent() into this GUID.
    bool refresh(HANDLE hWlan) {
        GUID found{};
        const bool isPresent = isAdapterPresent(hWlan, found);
        if (isPresent) set(found);
        return isPresent;
    }

private:
    mutable platform::Mutex m_mutex{"a GUID"};
    GUID m_guid GUARDED_BY(m_mutex){};
};

}  // namespace vexa
