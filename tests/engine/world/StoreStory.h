#pragma once

#include <string>
#include <vector>

#include "engine/world/RunStory.h"

namespace vexa::test {

/// A stored credential of the machine's user; its place in the list is its priority.
struct StoredCredential {
    int id = 1;
    std::string realm = "a.example";
    bool isTls = false;
    bool autoConnect = true;
};

struct StoreOptions {
    bool autoConnect = true;
    bool log = true;
    std::string homeRealm = {};
};

/// The `config` member of a scenario. A credential's texts tell its id: "name1", "u1" and "p1", or "ca1".
std::string storing(const std::vector<StoredCredential>& credentials, const StoreOptions& options = {});

/// What ADD_CREDENTIAL takes, for a realm that is also the name; `members` are more of its members, or
/// others.
std::string ttlsData(const std::string& realm, const std::string& members = "");
std::string tlsData(const std::string& realm, const std::string& members = "");

std::string repeat(const std::string& text, std::size_t times);

/// Sends a command of the hotspot port and gives the events that answer it, the list of credentials by id and
/// name: "2 b.example, 1 a.example", or its text if it is null.
std::string list(World& world, const std::string& command = "GET_ALL_CREDENTIAL_LIST",
                 const std::string& data = "");

}  // namespace vexa::test
