#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "client/panel/web/PanelHttp.h"

namespace vexa::client {

/// Who gets in: a browser of the user that came with the token, once, and has had the cookie since; and no
/// page of anybody else's in that browser.
class PanelDoor {
public:
    /// Makes the token and the cookie. Throws ClientError if the system has no random numbers.
    explicit PanelDoor(std::uint16_t port);

    /// `127.0.0.1:PORT`
    const std::string& host() const { return m_host; }
    /// With `http://` in front.
    const std::string& origin() const { return m_origin; }
    /// The address that lets in whoever opens it first.
    std::string url() const { return m_origin + kEntry + m_token; }

    /// The request is meant for this server, and no page from elsewhere has sent it.
    bool isForUs(const PanelRequest& request) const;
    /// Our own page has sent it, as browsers say of each WebSocket.
    bool isFromOurPage(const PanelRequest& request) const;
    bool hasCookie(const PanelRequest& request) const;

    static bool isEntry(const PanelRequest& request);
    /// The entry has the token, for the first time.
    bool letIn(const PanelRequest& entry);
    /// What a browser that is let in is to keep.
    std::string cookie() const;

private:
    static constexpr const char* kEntry = "/?token=";

    std::string m_host;
    std::string m_origin;
    std::string m_cookieName;
    std::string m_token;
    std::string m_secret;
    bool m_isTokenSpent = false;
};

}  // namespace vexa::client
