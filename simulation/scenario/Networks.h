#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "simulation/scenario/JsonPlace.h"

namespace vexa::simulation {

/// One realm entry of a network: names that are joined, and the EAP methods that go with them.
struct NetworkRealm {
    std::vector<std::string> names;
    std::vector<std::uint8_t> eapMethods;
};

/// What the authentication server of a network lets in; what is absent matches anything.
struct AcceptRule {
    int eapMethod = 0;
    std::optional<std::string> username;
    std::optional<std::string> password;
    std::optional<std::string> authMode;
    std::optional<std::string> caCert;
};

enum class AnqpAnswer { Ready, OnQuery, Never };

/// One BSS in range.
struct Network {
    Bytes bssid;
    Bytes ssid;
    bool hs20 = true;
    std::uint32_t networkType = 2;
    std::uint32_t internetAccess = 1;
    std::uint32_t channel = 36;
    bool reported = true;
    std::optional<std::vector<NetworkRealm>> realms;
    std::optional<Bytes> naiRealmList;
    AnqpAnswer anqp = AnqpAnswer::Ready;
    bool visible = true;
    bool osProfile = false;
    std::vector<AcceptRule> accepts;
    bool wasQueried = false;  ///< An ANQP query has ended since its way to answer was set.
};

/// Whether the network's answer to ANQP queries is there.
bool hasAnswered(const Network& network);

/// The names as they stand in the NAI Realm list, with ";" between them.
std::string joinedNames(const NetworkRealm& realm);

Network readNetwork(const JsonPlace& place);

/// Reads the members to change into `network`: of the two forms of the realm list, one replaces the other.
void changeNetwork(const JsonPlace& changes, Network& network);

}  // namespace vexa::simulation
