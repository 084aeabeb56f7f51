#pragma once

#include <string>
#include <string_view>
#include <vector>

#include "engine/AirStory.h"

namespace vexa::test {

/// A stored credential of the machine's user; its place in the list is its priority.
struct StoredCredential {
    int id = 1;
    std::string realm = "a.example";
    bool isTls = false;
    std::string user = {};      ///< "u" and the id if empty; TTLS alone
    std::string password = {};  ///< "p" and the id if empty; TTLS alone
    bool autoConnect = true;
    int priority = 0;  ///< 0: the place in the list
};

struct StoreOptions {
    bool autoConnect = true;
    std::string homeRealm = {};
    bool log = true;
};

/// The text of config.xml with the log on, and the same as a member of a scenario.
std::string storeText(const std::vector<StoredCredential>& credentials, const StoreOptions& options = {});
std::string storing(const std::vector<StoredCredential>& credentials, const StoreOptions& options = {});

/// Members of a network: its realms, by method, and whom it lets in.
std::string ttls(const std::string& realm = "a.example");
std::string tls(const std::string& realm = "a.example");
std::string both(const std::string& realm = "a.example");
std::string lettingIn(const std::string& rules);
std::string lettingInAll();

/// The requests that the WLAN service got since the last clearCalls, one a line: "cafe ttls u1", "cafe tls
/// machine", "plain cafe", "disconnect", each with " = error" behind it if it failed, and with whatever is
/// unusual in its other parameters.
std::string requests(World& world);

/// What the client heard of outcomes since the last call: "0", "1", "access", "no access", "hs20 true",
/// "networks" (a list, of any content), joined by blanks.
std::string outcomes(World& world);

/// The same without the lists.
std::string results(World& world);

/// The registry's value; -1 if there is none.
int eapMethod(World& world);

/// The SSID of the connection, "-" for none.
std::string connectedTo(World& world);

/// Whether the lines stand in the log in this order, with others between them; the first that is missing,
/// with the log, otherwise.
std::string missingInOrder(World& world, const std::vector<std::string>& lines, std::size_t logSize = 0);

void connect(World& world, const std::string& name);
void disconnect(World& world, const std::string& name);
void switchHs20(World& world, bool on);

}  // namespace vexa::test
