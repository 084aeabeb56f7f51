#pragma once

#include <cstdint>
#include <functional>
#include <string>

namespace vexa {

class Supplicant;

/// How an attempt to connect ended, for the client.
struct ConnectionResult {
    static constexpr std::uint32_t kSucceeded = 1;
    static constexpr std::uint32_t kFailed = 2;

    std::uint32_t m_result = kFailed;
    std::wstring m_profileName = {};
    std::wstring m_ssid = {};
    std::wstring m_reason = {};
};

/// What the engine tells the client. Filled in by the client's server; without it nothing is told. Called
/// with the network list lock held.
struct ClientEvents {
    std::function<void(Supplicant& supplicant)> sendNetworkList;
    std::function<void()> sendDetectedHotspot;
    std::function<void(const ConnectionResult& result)> sendConnectionResult;
    std::function<void()> sendInternetAccess;

    bool isComplete() const { return sendNetworkList != nullptr; }
};

}  // namespace vexa
