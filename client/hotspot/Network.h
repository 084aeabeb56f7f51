#pragma once

#include <json/value.h>

#include <string>
#include <vector>

namespace vexa::client {

/// A network of the hotspot list.
struct Network {
    struct Realm {
        int method = 0;
        std::string name;
        bool operator==(const Realm&) const = default;
    };
    enum class Internet { None, Offered, Missing, Reached };

    std::string name;
    bool isConnected = false;
    Internet internet = Internet::None;
    /// Its realms have been told to the service.
    bool hasRealms = false;
    std::vector<Realm> realms;

    bool operator==(const Network&) const = default;
};

using NetworkList = std::vector<Network>;

/// The command that asks for the list, and the event that tells it.

/// The list out of the payload of its event, in its order; entries that are none are left out.
NetworkList networkList(const Json::Value& payload);

/// Nothing if none is connected.
const Network* connectedNetwork(const NetworkList& list);

/// Nothing if none has the name.
const Network* findNetwork(const NetworkList& list, const std::string& name);

/// The one that a user means by what he gives: its name, else the name as it is shown to him. Nothing if
/// there is none.
const Network* networkMeant(const NetworkList& list, const std::string& given);

/// Their names in quotes; empty for none.
std::string namesOf(const NetworkList& list);

/// The three that look most like the given one, and how many more there are.
std::string namesLike(const NetworkList& list, const std::string& given);

/// The data of a command for the network of this name.
std::string networkData(const std::string& name);

/// Its realms with their methods, in words.
std::string realmsText(const Network& network);

/// One row per network, the connected one behind a star; a heading first. Lines have no line end.
std::vector<std::string> networkTable(const NetworkList& list);

Json::Value networksJson(const NetworkList& list);

}  // namespace vexa::client
