#pragma once

#include <optional>
#include <string>
#include <string_view>

#include "simulation/scenario/Networks.h"

namespace vexa::simulation {

/// What a connection takes from the text of a profile. Text is UTF-8; what the profile doesn't say is empty.
struct WlanProfile {
    std::string name;
    Bytes ssid;
    int eapMethod = 0;
    std::string authMode;
    std::string username;
    std::string password;
    std::string caCert;
};

/// Nothing if the text is no well-formed XML, or the profile has no SSID in hex or no EAP configuration.
std::optional<WlanProfile> readProfile(std::string_view utf8);

/// Whether the network's authentication server lets in who comes with this profile.
bool letsIn(const Network& network, const WlanProfile& profile);

}  // namespace vexa::simulation
