#pragma once

#include <json/value.h>

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

#include "engine/Story.h"
#include "unit/hotspot/WireBytes.h"

namespace vexa::test {

/// The address of the n-th BSS, as the scenario writes it.
std::string bssid(int number);

/// One BSS of a scenario. `members` are more of its members, as in R"("anqp":"never")".
std::string network(int number, const std::string& ssid, const std::string& members = "");

/// A `realms` member with one entry.
std::string realms(const std::string& names, const std::string& methods);

/// A scenario with these networks, and more members behind.
std::string air(const std::vector<std::string>& networks, const std::string& members = "");

/// An action on the n-th BSS, as in on("hide", 1).
std::string on(const std::string& action, int number, const std::string& members = "");

/// A message of the hotspot module with this payload; without `claimed` its length is told truly.
std::string moduleMessage(unsigned subtype, const Block& payload);
std::string moduleMessage(unsigned subtype, const Block& payload, unsigned claimed);

/// A network list as a client shows it: "Airport[a TLS,b TTLS] Cafe[] Hotel", with no brackets where no realm
/// data is, "*" behind the connected one; "null".
std::string shown(const Json::Value& list);

/// The events since the last call, with the network lists as shown.
std::string heard(World& world);

/// Asks for the list and gives it as shown.
std::string askedList(World& world);

/// The log's messages from this size of the log on, without numbers, times and empty lines.
std::string messagesSince(World& world, std::size_t logSize);

/// Those of the connecting thread's rounds alone: each is one line, its parts joined by " | ".
std::string roundsSince(World& world, std::size_t logSize);

/// The connecting thread has had its first rounds and waits, and nobody has unread events.
void settle(World& world);

/// How many requests of this subtype the hotspot module got since the last clearCalls.
int moduleRequests(World& world, unsigned subtype);

}  // namespace vexa::test
