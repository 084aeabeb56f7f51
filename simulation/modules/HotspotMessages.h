#pragma once

#include <cstdint>
#include <memory>
#include <span>
#include <vector>

#include "simulation/modules/IhvRequests.h"
#include "simulation/scenario/Networks.h"

namespace vexa::simulation {

// The messages of the hotspot module.

inline constexpr std::size_t kBssRecordSize = 52;

enum class HotspotEvent : std::uint32_t {
    DriverState = 1,
    NetworkList = 2,
    AnqpInfo = 3,
    AnqpQueryCompleted = 4,
    UserDisconnected = 5,
    SessionChanged = 6,
};

/// Whether the request has the size and the header that its kind must have.
bool isHotspotRequest(IhvRequest kind, std::span<const std::uint8_t> request);

/// The BSSID that an AnqpInfo request asks for.
std::span<const std::uint8_t> bssidOfRequest(std::span<const std::uint8_t> request);

Bytes bssRecord(const Network& network);

/// The record of a network of which no more than the SSID is known.
Bytes bssRecordOfSsid(std::span<const std::uint8_t> ssid);
void setIsHs20(std::span<std::uint8_t> record, std::uint32_t value);

Bytes bssRecords(const std::vector<std::shared_ptr<const Network>>& networks);

/// What a network answers to an ANQP query, as the module hands it on.
Bytes anqpInfo(const Network& network);

/// A notification with this payload.
Bytes hotspotMessage(HotspotEvent event, const Bytes& payload = {});
Bytes hotspotMessage(HotspotEvent event, std::uint32_t first, std::uint32_t second);

}  // namespace vexa::simulation
