#pragma once

#include <cstddef>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "base/WlanHandle.h"
#include "connection/SupplicantState.h"
#include "hotspot/IhvMessages.h"
#include "platform/WlanApi.h"

namespace vexa {

/// The network that an interface is connected to.
struct CurrentConnection {
    DOT11_SSID ssid{};
    MacAddress bssid{};
};

/// One interface of the WLAN service: what this system asks about it and wants of it. Any thread may call
/// anything. Without an open handle a query has no answer, and a request fails as the WLAN service says.
class WlanInterface {
public:
    explicit WlanInterface(const GUID& guid) : m_guid(guid) {}

    const GUID& guid() const { return m_guid; }

    /// False, with a line in the log, if there is no handle to be had.
    bool open();
    void close() { m_handle.close(); }

    /// InvalidState if it can't be told.
    SupplicantState queryState() const;
    /// The software radio of the first PHY; true also if that can't be told.
    bool isRadioOn() const;
    std::optional<CurrentConnection> queryCurrentConnection(bool includeConnecting) const;

    /// The WLAN service's result. What the hotspot module answers is cut to kIhvReplySize.
    DWORD tellModule(std::vector<std::byte> request) const;
    DWORD askModule(std::vector<std::byte> request, std::vector<std::byte>& reply) const;

    /// Requests; notifications tell what becomes of them. With a profile's text, or with one that the
    /// operating system chooses.
    DWORD connectByProfile(const std::wstring& profileXml) const;
    DWORD connectBySsid(std::string_view ssid) const;
    DWORD disconnect() const;

private:
    DWORD connect(WLAN_CONNECTION_PARAMETERS parameters) const;
    DWORD callModule(std::vector<std::byte>& request, std::span<std::byte> reply, DWORD& returned) const;

    const GUID m_guid;
    WlanHandle m_handle;
};

}  // namespace vexa
