#include "simulation/parts/WlanProfile.h"

#include <algorithm>
#include <charconv>
#include <pugixml.hpp>

#include "platform/WlanApi.h"
#include "text/XmlWellFormed.h"

namespace vexa::simulation {

namespace {

constexpr unsigned kParse = pugi::parse_default | pugi::parse_ws_pcdata;
constexpr const char* kOneX = "MSM/security/OneX";
constexpr const char* kEapHost = "EAPConfig/EapHostConfig";

/// All text right below an element, blanks included.
std::string textOf(pugi::xml_node parent, const char* path) {
    std::string text;
    for (const pugi::xml_node child : parent.first_element_by_path(path)) {
        if (child.type() == pugi::node_pcdata || child.type() == pugi::node_cdata) text += child.value();
    }
    return text;
}

int numberOf(const std::string& text) {
    int number = 0;
    const char* const end = text.data() + text.size();
    const auto [stop, error] = std::from_chars(text.data(), end, number);
    return error == std::errc() && stop == end ? number : 0;
}

bool isSsid(const std::optional<Bytes>& ssid) {
    return ssid && !ssid->empty() && ssid->size() <= DOT11_SSID_MAX_LENGTH;
}

bool agrees(const std::optional<std::string>& wanted, const std::string& given) {
    return !wanted || *wanted == given;
}

}  // namespace

std::optional<WlanProfile> readProfile(std::string_view utf8) {
    pugi::xml_document document;
    // What it says of its encoding was true of the bytes that it was read from.
    if (!isWellFormedXml(utf8, declaredXmlEncoding(utf8)) ||
        !document.load_buffer(utf8.data(), utf8.size(), kParse, pugi::encoding_utf8)) {
        return std::nullopt;
    }
    const pugi::xml_node root = document.child("WLANProfile");
    const pugi::xml_node oneX = root.first_element_by_path(kOneX);
    const pugi::xml_node eapHost = oneX.first_element_by_path(kEapHost);
    auto ssid = bytesFromHex(textOf(root, "SSIDConfig/SSID/hex"));
    if (!isSsid(ssid) || !eapHost) return std::nullopt;
    WlanProfile profile;
    profile.name = textOf(root, "name");
    profile.ssid = *std::move(ssid);
    profile.eapMethod = numberOf(textOf(eapHost, "EapMethod/Type"));
    profile.authMode = textOf(oneX, "authMode");
    profile.username = textOf(eapHost, "Config/ConnData/username");
    profile.password = textOf(eapHost, "Config/ConnData/password");
    profile.caCert = textOf(eapHost, "Config/Eap/EapType/ServerValidation/TrustedRootCA");
    return profile;
}

bool letsIn(const Network& network, const WlanProfile& profile) {
    return std::any_of(network.accepts.begin(), network.accepts.end(), [&](const AcceptRule& rule) {
        return rule.eapMethod == profile.eapMethod && agrees(rule.username, profile.username) &&
               agrees(rule.password, profile.password) && agrees(rule.authMode, profile.authMode) &&
               agrees(rule.caCert, profile.caCert);
    });
}

}  // namespace vexa::simulation
