#include "simulation/modules/IhvRequests.h"

#include "simulation/modules/SpectralMessages.h"
#include "simulation/text/Wire.h"

namespace vexa::simulation {

namespace {

constexpr std::size_t kHotspotHeader = 16;
constexpr std::size_t kHotspotSubtypeAt = 8;

struct Row {
    WLAN_IHV_CONTROL_TYPE type;
    std::uint32_t code;
    IhvRequest request;
    std::string_view name;
};

constexpr Row kRows[] = {
    {wlan_ihv_control_type_service, 3, IhvRequest::AnqpQuery, "anqpQuery"},
    {wlan_ihv_control_type_service, 5, IhvRequest::BssList, "bssList"},
    {wlan_ihv_control_type_service, 8, IhvRequest::AnqpInfo, "anqpInfo"},
    {wlan_ihv_control_type_driver, kScanControlCode, IhvRequest::Scan, "scan"},
    {wlan_ihv_control_type_driver, kChannelListCode, IhvRequest::ChannelList, "channelList"},
};

bool codeOf(WLAN_IHV_CONTROL_TYPE type, std::span<const std::uint8_t> request, std::uint32_t& code) {
    if (type == wlan_ihv_control_type_driver) {
        if (request.size() < kSpectralHeaderSize) return false;
        code = loadU32(request, kControlCodeAt);
        return true;
    }
    if (request.size() < kHotspotHeader || loadU32(request, 0) != kHotspotSignature) return false;
    code = loadU32(request, kHotspotSubtypeAt);
    return true;
}

}  // namespace

IhvRequest classifyIhvRequest(WLAN_IHV_CONTROL_TYPE type, std::span<const std::uint8_t> request) {
    std::uint32_t code = 0;
    if (!codeOf(type, request, code)) return IhvRequest::Unknown;
    for (const Row& row : kRows) {
        if (row.type == type && row.code == code) return row.request;
    }
    return IhvRequest::Unknown;
}

std::string_view nameOf(IhvRequest request) {
    for (const Row& row : kRows) {
        if (row.request == request) return row.name;
    }
    return {};
}

}  // namespace vexa::simulation
