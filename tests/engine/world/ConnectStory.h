#pragma once

#include <optional>
#include <string>
#include <vector>

#include "engine/world/AirStory.h"
#include "engine/world/StoreStory.h"

namespace vexa::test {

/// Members of a network: its realms, by method, and whom it lets in.
std::string ttls(const std::string& realm = "a.example");
std::string tls(const std::string& realm = "a.example");
std::string both(const std::string& realm = "a.example");
std::string lettingIn(const std::string& rules);

/// A network that lets in whoever fits its realms.
std::string open(int number, const std::string& ssid, const std::string& realms);
inline const std::string kCafe = open(1, "cafe", ttls());
inline const std::string kHotel = open(2, "hotel", ttls("b.example"));

/// What the client and the machine show of the connection. What isn't named isn't looked at.
struct Standing {
    /// What the WLAN service was asked for since the last forget(): "cafe ttls u1; cafe tls ca1 machine;
    /// plain cafe; disconnect", each with " = error" behind it if it failed, and with whatever is unusual in
    /// it.
    std::optional<std::string> requests = {};
    /// What the client heard of outcomes since the last look: "0", "1", "access", "no access", "hs20 true",
    /// joined by blanks.
    std::optional<std::string> results = {};
    /// The SSID, "-" for none.
    std::optional<std::string> connected = {};
    /// The registry's value; -1 if there is none.
    std::optional<int> eapMethod = {};
    /// The results with "networks" for each list.
    std::optional<std::string> outcomes = {};
};
void expectStanding(Story& story, const Standing& wanted);

std::vector<std::string> requests(World& world);
std::string joined(const std::vector<std::string>& requests);
std::string connectedTo(World& world);

/// The user's messages.
std::string connecting(const std::string& name);
std::string disconnecting(const std::string& name);
inline const std::string kHs20Off = sending("SET_HOTSPOT_AUTO_CONNECT", "false");
inline const std::string kHs20On = sending("SET_HOTSPOT_AUTO_CONNECT", "true");

}  // namespace vexa::test
