#pragma once

#include <json/value.h>

#include <string>
#include <string_view>
#include <vector>

#include "engine/world/RunStory.h"
#include "unit/hotspot/WireBytes.h"

namespace vexa::test {

/// One BSS of a scenario, the n-th. `members` are more of its members, as in R"("anqp":"never")".
std::string network(int number, const std::string& ssid, const std::string& members = "");

/// A `realms` member with one entry.
std::string realms(const std::string& names, const std::string& methods);

/// A scenario with these networks, and more members behind.
std::string air(const std::vector<std::string>& networks, const std::string& members = "");

/// An action on the n-th BSS, as in on("hide", 1).
std::string on(const std::string& action, int number, const std::string& members = "");
std::string adding(const std::string& network);
inline const std::string kReport = doing("reportNetworks");
inline const std::string kRadioOff = doing("radio", R"("software":"off")");
inline const std::string kRadioOn = doing("radio", R"("software":"on")");

/// A message of the hotspot module with this payload; without `claimed` its length is told truly.
std::string moduleMessage(unsigned subtype, const Block& payload);
std::string moduleMessage(unsigned subtype, const Block& payload, unsigned claimed);

/// The module's next answer to a request, in place of its own.
std::string reply(const std::string& match, const Block& bytes);
/// The next calls that fail.
std::string failing(const std::string& call, int error, const std::string& members = "");

/// The events since the last call, by their ids; a network list as "networks" and what askedList() gives.
std::string heard(World& world);

/// Asks for the network list: "Airport[a TLS,b TTLS] Cafe[] Hotel", with no brackets where no realm data is,
/// "*" behind the connected one; "null"; "nothing" if no answer came.
std::string askedList(World& world);

/// The messages of the connecting thread's rounds: each round is one line, its parts joined by " | ".
std::string rounds(World& world);

/// How often a text stands in another.
int count(std::string_view text, std::string_view part);

/// Lets this time pass and forgets all that was. After 25 seconds the connecting thread has had its first
/// rounds and waits. Then all these deeds happen.
void settle(World& world, platform::Duration span, const std::vector<std::string>& deeds = {});
inline void settle(World& world, const std::vector<std::string>& deeds = {}) {
    settle(world, std::chrono::seconds(25), deeds);
}

/// How many requests of this subtype the hotspot module got since the last forget().
int moduleRequests(World& world, unsigned subtype);

}  // namespace vexa::test
