#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "text/LittleEndian.h"

namespace vexa {

// The messages of the adapter vendor's hotspot module, little-endian and unaligned. Nothing here reads behind
// the bytes that it is given, whatever they claim.

inline constexpr std::uint32_t HS20_MODULE_SIGNATURE = 0x03C45E00;
inline constexpr std::size_t kIhvHeaderSize = 16;
inline constexpr std::size_t kBssRecordSize = 52;
inline constexpr std::size_t kMaxSsidLength = 32;

/// Both answers that carry data are fetched through a buffer of this size, and never in parts.
inline constexpr std::size_t kIhvReplySize = 10240;

enum class IhvRequest : std::uint32_t {
    QueryAnqp = 3,    // HS20_IHV_QUERY_ANQP
    GetBssList = 5,   // HS20_IHV_GET_BSS_LIST
    GetAnqpInfo = 8,  // HS20_IHV_GET_ANQP_INFO
};

enum class IhvNotification : std::uint32_t {
    StateChanged = 1,
    NetworkListChanged = 2,
    AnqpInfoChanged = 3,
    AnqpQueryCompleted = 4,
    UserDisconnected = 5,
    SessionChanged = 6,
};

using MacAddress = std::array<std::uint8_t, 6>;

/// "%02x:%02x:%02x:%02x:%02x:%02x".
std::string toText(const MacAddress& mac);

/// One BSS as the module describes it.
struct Hs20BssRecord {
    MacAddress macAddress{};
    std::string ssid;          ///< Up to the first NUL: 34 bytes, where 32 are no SSID any more.
    std::uint32_t isHs20 = 0;  ///< 1: a Hotspot 2.0 network; any other value: none.
    std::uint32_t networkType = 0;
    std::uint32_t internetAccess = 0;  ///< Not 0: the network offers it.
};

/// The whole records of a block of bytes, at most `limit`.
std::vector<Hs20BssRecord> parseBssRecords(Bytes bytes, std::size_t limit = SIZE_MAX);

/// The record at the beginning of a block; fields behind its end read as 0.
Hs20BssRecord parseBssRecord(Bytes bytes);

/// A request without a record, or with one.
std::vector<std::byte> ihvRequest(IhvRequest subtype);
std::vector<std::byte> ihvRequest(IhvRequest subtype, const Hs20BssRecord& record);

/// A notification, read from its block.
struct IhvMessage {
    IhvNotification subtype;
    Bytes payload;  ///< As long as it claims, but no longer than the block.
    Bytes block;    ///< All behind the header, for messages whose length is not looked at.
};

/// REQUIRES: kIhvHeaderSize bytes.
IhvMessage parseIhvMessage(Bytes block);

/// A 32-bit number of a payload, 0 if it isn't there.
std::uint32_t numberAt(Bytes payload, std::size_t offset);

}  // namespace vexa
