#include "base/IpInterface.h"

#include <algorithm>
#include <new>
#include <string>

#include "base/DiagnosticLog.h"
#include "platform/Guid.h"
#include "platform/NetworkAdapters.h"

namespace vexa {

namespace {

constexpr std::uint32_t kFirstBufferSize = 15000;
constexpr int kMaxTries = 3;

// The lists of the IP helper can grow between two calls, but not for ever.
template <class Query>
auto queryWithGrowingBuffer(const char* name, Query query) {
    auto answer = query(kFirstBufferSize);
    for (int i = 1; answer.error == platform::kErrorBufferOverflow && i < kMaxTries; ++i)
        answer = query(answer.neededSize);
    if (answer.error != 0) Log(2, "Call to %s failed with error: %d", name, static_cast<int>(answer.error));
    return answer;
}

}  // namespace

bool IpInterface::find(const GUID& guid) try {
    const std::string guidText = guidToString(guid);
    const auto list = queryWithGrowingBuffer("GetAdaptersAddresses", platform::getAdaptersAddresses);
    if (list.error != 0) return false;
    const auto found = std::find_if(list.adapters.begin(), list.adapters.end(), [&](const auto& adapter) {
        return adapter.interfaceType == platform::kInterfaceTypeIeee80211 &&
               guidText.starts_with(adapter.name);
    });
    if (found == list.adapters.end()) {
        Log(2, "!!!Cannot query interface mac address.");
        return false;
    }
    std::copy_n(found->physicalAddress.begin(), std::min(found->physicalAddress.size(), m_macAddress.size()),
                m_macAddress.begin());
    m_index = found->interfaceIndex;
    const auto& mac = m_macAddress;
    Log(2, "!!!Query interface mac address succeeded, mac address %02x:%02x:%02x:%02x:%02x:%02x", mac[0],
        mac[1], mac[2], mac[3], mac[4], mac[5]);
    return true;
} catch (const std::bad_alloc&) {
    return false;
}

bool IpInterface::hasInternetAccess() const {
    const auto info = queryWithGrowingBuffer("GetPerAdapterInfo", [this](std::uint32_t size) {
        return platform::getPerAdapterInfo(m_index, size);
    });
    return info.error == 0 && !info.firstDnsServer.empty();
}

}  // namespace vexa
