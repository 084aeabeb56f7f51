#pragma once

#include <atomic>

#include "platform/WlanApi.h"

namespace vexa {

/// What this system speaks to the WLAN service.
inline constexpr DWORD kWlanClientVersion = 2;

/// A handle of the WLAN service, closed by close() or with its owner. Any thread may read it; what a thread
/// has read can be closed before it is used, and is then refused by the WLAN service.
class WlanHandle {
public:
    WlanHandle() = default;
    ~WlanHandle() { close(); }
    WlanHandle(const WlanHandle&) = delete;
    WlanHandle& operator=(const WlanHandle&) = delete;

    /// The WLAN service's result. REQUIRES: not open.
    DWORD open() {
        HANDLE handle = nullptr;
        DWORD negotiated = 0;
        const DWORD result = WlanOpenHandle(kWlanClientVersion, nullptr, &negotiated, &handle);
        if (result == ERROR_SUCCESS && handle != INVALID_HANDLE_VALUE) m_handle = handle;
        return result;
    }

    void close() {
        if (const HANDLE handle = m_handle.exchange(nullptr)) WlanCloseHandle(handle, nullptr);
    }

    /// Null while it isn't open.
    HANDLE get() const { return m_handle; }

private:
    std::atomic<HANDLE> m_handle{nullptr};
};

}  // namespace vexa
