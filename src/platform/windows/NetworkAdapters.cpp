#include "platform/NetworkAdapters.h"

#include <winsock2.h>
// After <winsock2.h>.
#include <iphlpapi.h>

#include <algorithm>
#include <cstddef>

namespace vexa::platform {

static_assert(kErrorBufferOverflow == ERROR_BUFFER_OVERFLOW);
static_assert(kInterfaceTypeIeee80211 == IF_TYPE_IEEE80211);

namespace {

/// Storage of this many bytes, aligned for the structures that the IP helper writes into it.
template <class Structure>
class Buffer {
public:
    explicit Buffer(std::uint32_t size) : m_units(size / sizeof(std::max_align_t) + 1) {}
    Structure* get() { return reinterpret_cast<Structure*>(m_units.data()); }

private:
    std::vector<std::max_align_t> m_units;
};

AdapterAddresses addressesOf(const IP_ADAPTER_ADDRESSES& adapter) {
    const BYTE* const address = adapter.PhysicalAddress;
    const ULONG length = std::min<ULONG>(adapter.PhysicalAddressLength, MAX_ADAPTER_ADDRESS_LENGTH);
    return {adapter.IfType, adapter.IfIndex, adapter.AdapterName, {address, address + length}};
}

}  // namespace

AdapterList getAdaptersAddresses(std::uint32_t bufferSize) {
    Buffer<IP_ADAPTER_ADDRESSES> buffer(bufferSize);
    ULONG size = bufferSize;
    const ULONG error = GetAdaptersAddresses(AF_UNSPEC, 0, nullptr, buffer.get(), &size);
    AdapterList list{error, size, {}};
    if (error != ERROR_SUCCESS) return list;
    for (const auto* adapter = buffer.get(); adapter != nullptr; adapter = adapter->Next)
        list.adapters.push_back(addressesOf(*adapter));
    return list;
}

PerAdapterInfo getPerAdapterInfo(std::uint32_t interfaceIndex, std::uint32_t bufferSize) {
    Buffer<IP_PER_ADAPTER_INFO> buffer(bufferSize);
    ULONG size = bufferSize;
    const DWORD error = GetPerAdapterInfo(interfaceIndex, buffer.get(), &size);
    if (error != ERROR_SUCCESS) return {error, size, {}};
    return {error, size, buffer.get()->DnsServerList.IpAddress.String};
}

}  // namespace vexa::platform
