#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace vexa::platform {

inline constexpr std::uint32_t kErrorBufferOverflow = 111;
inline constexpr std::uint32_t kInterfaceTypeIeee80211 = 71;

/// A network adapter as the IP helper knows it.
struct AdapterAddresses {
    std::uint32_t interfaceType;
    std::uint32_t interfaceIndex;
    std::string name;  ///< The GUID in braces.
    std::vector<std::uint8_t> physicalAddress;
};

/// Answers of the IP helper: 0 or its error. kErrorBufferOverflow: `neededSize` bytes would have been enough.
struct AdapterList {
    std::uint32_t error;
    std::uint32_t neededSize;
    std::vector<AdapterAddresses> adapters;
};
struct PerAdapterInfo {
    std::uint32_t error;
    std::uint32_t neededSize;
    std::string firstDnsServer;  ///< Empty if the adapter has none.
};

/// All adapters, read through a buffer of this many bytes.
AdapterList getAdaptersAddresses(std::uint32_t bufferSize);

/// Of the adapter with this interface index.
PerAdapterInfo getPerAdapterInfo(std::uint32_t interfaceIndex, std::uint32_t bufferSize);

}  // namespace vexa::platform
