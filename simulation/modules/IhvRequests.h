#pragma once

#include <cstdint>
#include <span>
#include <string_view>

#include "platform/WlanApi.h"

namespace vexa::simulation {

/// With which the messages of the hotspot module begin.
inline constexpr std::uint32_t kHotspotSignature = 0x03C45E00;

/// The requests that the maker's two modules know.
enum class IhvRequest { BssList, AnqpInfo, AnqpQuery, Scan, ChannelList, Unknown };

/// Tells a request by its type, signature and code; its other fields may still be wrong.
IhvRequest classifyIhvRequest(WLAN_IHV_CONTROL_TYPE type, std::span<const std::uint8_t> request);

/// The name by which faults and replies speak of it; empty for an unknown one.
std::string_view nameOf(IhvRequest request);

}  // namespace vexa::simulation
