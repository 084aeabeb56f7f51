#pragma once

#include <array>
#include <atomic>
#include <cstdint>

#include "platform/WlanApi.h"

namespace vexa {

/// The IP side of a WLAN interface. One thread looks it up; any thread may ask.
class IpInterface {
public:
    /// False, with a line in the log, if the adapters can't be listed or the interface is not among them.
    bool find(const GUID& guid);

    /// Whether the adapter has a DNS server; false also if that can't be told.
    bool hasInternetAccess() const;

private:
    std::array<std::uint8_t, 6> m_macAddress{};
    std::atomic<std::uint32_t> m_index{0};
};

}  // namespace vexa
