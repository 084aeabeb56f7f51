#include <algorithm>
#include <string>
#include <unordered_set>

#include "base/DiagnosticLog.h"
#include "config/Config.h"

namespace vexa {

ResultCode Config::readUsers(Reading& reading, bool& isChanged) {
    const bool isTraced = reading.trace == Trace::Yes;
    if (isTraced) Log(2, "Reading all user info...");
    if (m_userName.empty()) return kFailure;
    std::vector<Node> users;
    if (m_xmlDoc.selectNodes("/*/users/*", Node(), users) != kSuccess) return kFailure;
    if (isTraced) Log(2, "Retrieved total %d user info", static_cast<int>(users.size()));
    if (const Node user = findCurrentUser(users, reading.trace)) {
        reading.hasUser = true;
        std::vector<Node> references;
        if (m_xmlDoc.selectNodes("credentials/*", user, references) != kSuccess) return kFailure;
        if (isTraced) Log(2, "\t\tcredential count=%d", static_cast<int>(references.size()));
        isChanged = applyReferences(references, reading) || isChanged;
    }
    if (!isTraced) return kSuccess;
    for (const Credential* credential : reading.table.copyCredentialPointers())
        reading.inFile.push_back(*credential);
    reading.table.placeUnplacedCredentials();
    reading.table.dumpCredentials();
    return kSuccess;
}

Config::Node Config::findCurrentUser(const std::vector<Node>& users, Trace trace) {
    int index = 0;
    for (const Node user : users) {
        ++index;
        if (trace == Trace::Yes) Log(2, "\tReading user info with index=%d...", index);
        if (textOf(user, "username", kInvalid) == m_userName) return user;
    }
    return {};
}

// The user's places, one by one. True if others have deleted credentials that he lists, or added some that he
// doesn't.
bool Config::applyReferences(const std::vector<Node>& references, const Reading& reading) {
    const bool isTraced = reading.trace == Trace::Yes;
    const auto present = reading.table.credentialsById();
    std::unordered_set<std::int32_t> listed;
    bool isChanged = false;
    for (const Node reference : references) {
        const std::int32_t id = numberOf(reference, "id");
        if (id <= 0) continue;
        listed.insert(id);
        const std::int32_t priority = numberOf(reference, "priority");
        if (priority < 0) continue;
        const auto found = present.find(id);
        if (found != present.end()) {
            CredentialTable::setPriority(*found->second, priority);
            if (isTraced) Log(2, "\t\t\tid=%d, priority=%d", id, priority);
        } else {
            isChanged = true;
            if (isTraced)
                Log(3,
                    "All-user credential deleted by others,we should delete this credential for current user, cred id=%d",
                    id);
        }
    }
    const auto all = reading.table.copyCredentialPointers();
    return isChanged || std::any_of(all.begin(), all.end(), [&](const Credential* credential) {
               return !listed.contains(credential->m_id);
           });
}

}  // namespace vexa
