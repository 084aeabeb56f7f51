#include "client/panel/web/PanelDoor.h"

#include <algorithm>
#include <array>
#include <boost/beast/http/field.hpp>
#include <cstddef>

#include "client/machine/SystemRandom.h"

namespace vexa::client {

namespace http = boost::beast::http;

namespace {

std::string newSecret() {
    constexpr std::string_view kDigits = "0123456789abcdef";
    std::array<std::uint8_t, 16> bytes{};
    fillWithRandom(bytes);
    std::string text;
    for (const std::uint8_t byte : bytes) {
        text += kDigits[byte >> 4U];
        text += kDigits[byte & 0xFU];
    }
    return text;
}

// How long it takes tells nothing of how much of it is right.
bool isSame(std::string_view given, std::string_view secret) {
    if (given.size() != secret.size()) return false;
    unsigned difference = 0;
    for (std::size_t i = 0; i < secret.size(); ++i)
        difference |= static_cast<unsigned>(given[i]) ^ static_cast<unsigned>(secret[i]);
    return difference == 0;
}

std::string_view trimmed(std::string_view text) {
    const std::size_t begin = text.find_first_not_of(' ');
    if (begin == text.npos) return {};
    return text.substr(begin, text.find_last_not_of(' ') + 1 - begin);
}

}  // namespace

PanelDoor::PanelDoor(std::uint16_t port)
    : m_host("127.0.0.1:" + std::to_string(port)),
      m_origin("http://" + m_host),
      m_cookieName("vexa-panel-" + std::to_string(port)),
      m_token(newSecret()),
      m_secret(newSecret()) {}

// A name that somebody else has made to mean this address is no host of ours. Pages of other servers of this
// address would come with the cookie; what browsers tell of who asks keeps them out.
bool PanelDoor::isForUs(const PanelRequest& request) const {
    if (request.count(http::field::host) != 1 || request[http::field::host] != m_host) return false;
    if (request.count(http::field::origin) != 0 && !isFromOurPage(request)) return false;
    const std::string_view site = request["Sec-Fetch-Site"];
    return site.empty() || site == "same-origin" || site == "none";
}

bool PanelDoor::isFromOurPage(const PanelRequest& request) const {
    return request.count(http::field::origin) == 1 && request[http::field::origin] == m_origin;
}

bool PanelDoor::hasCookie(const PanelRequest& request) const {
    const auto [begin, end] = request.equal_range(http::field::cookie);
    for (auto field = begin; field != end; ++field) {
        std::string_view rest = field->value();
        while (!rest.empty()) {
            const std::string_view pair = trimmed(rest.substr(0, rest.find(';')));
            rest.remove_prefix(
                std::min(rest.size(), rest.find(';') == rest.npos ? rest.size() : rest.find(';') + 1));
            const std::size_t equals = pair.find('=');
            if (equals == pair.npos || pair.substr(0, equals) != m_cookieName) continue;
            if (isSame(pair.substr(equals + 1), m_secret)) return true;
        }
    }
    return false;
}

bool PanelDoor::isEntry(const PanelRequest& request) {
    return request.method() == http::verb::get && std::string_view(request.target()).starts_with(kEntry);
}

bool PanelDoor::letIn(const PanelRequest& entry) {
    const std::string_view given = std::string_view(entry.target()).substr(std::string_view(kEntry).size());
    if (m_isTokenSpent || !isSame(given, m_token)) return false;
    m_isTokenSpent = true;
    return true;
}

std::string PanelDoor::cookie() const {
    return m_cookieName + "=" + m_secret + "; HttpOnly; SameSite=Strict; Path=/";
}

}  // namespace vexa::client
