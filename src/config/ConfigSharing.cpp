#include <algorithm>
#include <memory>
#include <utility>

#include "base/DiagnosticLog.h"
#include "config/Config.h"
#include "text/ScopeGuard.h"
#include "text/TextConversion.h"

namespace vexa {

namespace {

constexpr std::chrono::milliseconds kLockPatience{2000};

// Each save signs what all see.
bool isTheSame(Credential a, const Credential& b) {
    a.m_creator = b.m_creator;
    return holdTheSame(a, b);
}

const Credential* find(const std::unordered_map<std::int32_t, const Credential*>& byId, std::int32_t id) {
    const auto found = byId.find(id);
    return found == byId.end() ? nullptr : found->second;
}

}  // namespace

// A holder that hangs must not hang the others with it.
Config::FileLock Config::lockFile() const {
    return {.lock = platform::FolderLock::take(m_baseDir, kLockPatience)};
}

Config::FileLock Config::beginChange() {
    FileLock held = lockFile();
    const ScopeGuard release([this]() NO_THREAD_SAFETY_ANALYSIS { m_xmlDoc.release(); });
    m_renamed.clear();
    ResultCode result = kFailure;
    const auto stored = readFile(result);
    if (!stored) return held;
    held.isRead = stored->isKnown();
    if (held.isRead) return held;
    std::string content = stored->text();
    if (openDocument(content) != kSuccess) return held;
    CredentialTable table;
    Reading reading{.table = table, .trace = Trace::No};
    if (!readSilently(reading)) return held;
    takeOver(reading);
    m_content = std::move(content);
    m_frame.reset();
    held.isRead = true;
    return held;
}

std::int32_t Config::currentId(std::int32_t id) const {
    const auto renamed = m_renamed.find(id);
    return renamed == m_renamed.end() ? id : renamed->second;
}

// The credentials of the open document in the places that the user's list gives them; what it doesn't list
// has none.
bool Config::readSilently(Reading& reading) {
    bool isChanged = false;
    return readCredentials(reading, isChanged) == kSuccess && readUsers(reading, isChanged) == kSuccess;
}

// Memory and file hold the same now, each in its way.
void Config::remember(const std::vector<Credential>& inFile, bool hasUser) {
    const auto inMemory = m_credentials.credentialsById();
    std::unordered_map<std::int32_t, Known> known;
    for (const Credential& theirs : inFile) {
        const Credential* const mine = find(inMemory, theirs.m_id);
        known.try_emplace(theirs.m_id, Known{.inFile = theirs, .inMemory = mine == nullptr ? theirs : *mine});
    }
    m_known.swap(known);
    m_hadUser = hasUser;
}

// What the file holds otherwise than before is what others changed; what memory holds otherwise is what could
// not be saved. That has no id of its own until it is in the file.
void Config::takeOver(const Reading& stored) {
    // No service takes a list of a user away: this file has been made anew, and others have deleted nothing.
    if (m_hadUser && !stored.hasUser) m_known.clear();
    takeOverDeletions(stored.table);
    for (const Credential* mine : m_credentials.copyCredentialPointers())
        if (stored.foreignIds.contains(mine->m_id)) giveNewId(*mine);
    const auto inMemory = m_credentials.credentialsById();
    std::unordered_map<std::int32_t, Known> known;
    for (const Credential* theirs : stored.table.copyCredentialPointers()) {
        const auto before = m_known.find(theirs->m_id);
        const Credential* const mine = find(inMemory, theirs->m_id);
        Credential now = before == m_known.end() ? takeOverNew(*theirs, mine)
                                                 : takeOverKnown(*theirs, before->second, mine);
        known.try_emplace(theirs->m_id, Known{.inFile = *theirs, .inMemory = std::move(now)});
    }
    takeOverPlaces(stored.table);
    m_known = std::move(known);
    m_hadUser = stored.hasUser;
}

void Config::takeOverDeletions(const CredentialTable& stored) {
    const auto inFile = stored.credentialsById();
    const auto inMemory = m_credentials.credentialsById();
    for (const auto& [id, before] : m_known) {
        const Credential* const mine = find(inMemory, id);
        if (mine != nullptr && !inFile.contains(id) && holdTheSame(*mine, before.inMemory))
            m_credentials.deleteCredential(id);
    }
}

void Config::giveNewId(const Credential& credential) {
    if (m_nextCredId == followingId(m_nextCredId)) return;
    Log(6, "ERROR: Found duplicate credential id=%d, new id=%d", credential.m_id, m_nextCredId);
    m_renamed[credential.m_id] = m_nextCredId;
    CredentialTable::setId(credential, m_nextCredId);
    advanceNextCredId();
}

// This and the next give what memory held when it last agreed with the file.
Credential Config::takeOverKnown(const Credential& theirs, const Known& before, const Credential* mine) {
    if (mine == nullptr || !holdTheSame(*mine, before.inMemory)) return before.inMemory;
    if (!holdTheSame(theirs, before.inFile)) m_credentials.replace(*mine, theirs);
    return *mine;
}

// One that could not be saved may have the id that another was given meanwhile.
Credential Config::takeOverNew(const Credential& theirs, const Credential* mine) {
    if (mine != nullptr && isTheSame(*mine, theirs)) return theirs;
    if (mine != nullptr) giveNewId(*mine);
    m_credentials.appendUnplaced(std::make_unique<Credential>(theirs));
    return theirs;
}

// The list is the user's own; somebody may have changed it by hand, or he himself by another service.
void Config::takeOverPlaces(const CredentialTable& stored) {
    const auto all = stored.copyCredentialPointers();
    const bool isChanged =
        std::any_of(all.begin(), all.end(), [this](const Credential* theirs) NO_THREAD_SAFETY_ANALYSIS {
            const auto before = m_known.find(theirs->m_id);
            return before != m_known.end() && before->second.inFile.m_priority != theirs->m_priority;
        });
    if (isChanged && !m_bUnsaved) {
        const auto inMemory = m_credentials.credentialsById();
        for (const Credential* theirs : all)
            if (const Credential* const mine = find(inMemory, theirs->m_id))
                CredentialTable::setPriority(*mine, theirs->m_priority);
    }
    m_credentials.placeUnplacedCredentials();
}

}  // namespace vexa
