#include "config/CredentialTable.h"

#include <algorithm>
#include <limits>
#include <new>
#include <utility>

#include "base/DiagnosticLog.h"
#include "text/TextConversion.h"

namespace vexa {

namespace {

constexpr std::int32_t kLargestPriority = std::numeric_limits<std::int32_t>::max();

bool isPlaced(const Credential& credential) {
    return credential.m_priority != 0 && credential.m_priority != CRED_PRIORITY_LOWEST;
}

// Behind the lock of all tables: a copy may be compared with what another one holds.
std::uint64_t nextEdition() REQUIRES(g_hs20Lock) {
    static std::uint64_t last = 0;
    return ++last;
}

// Null if memory runs out.
std::unique_ptr<Credential> makeRecord(std::int32_t id, const std::wstring& creator, std::int32_t type,
                                       std::int32_t accessType) {
    try {
        return std::make_unique<Credential>(id, creator, type, accessType);
    } catch (const std::bad_alloc&) {
        return nullptr;
    }
}

// The texts that a credential of its type has. False: the type has none.
bool applyTexts(Credential& credential, const CredentialInput& input, const std::wstring& name) {
    if (credential.m_type == CRED_TYPE_EAP_TTLS) {
        credential.m_username = input.username;
        credential.m_password = input.password;
    } else if (credential.m_type == CRED_TYPE_EAP_TLS) {
        credential.m_caCert = input.caCert;
        credential.m_clientCert = input.clientCert;
    } else {
        return false;
    }
    credential.m_credName = name;
    credential.m_realm = input.realm;
    credential.m_bAutoConnect = input.autoConnect;
    return true;
}

}  // namespace

bool CredentialTable::isDuplicate(const CredentialInput& input, const std::wstring& name) const {
    const Credential* found = nullptr;
    if (findCredentialByTypeAndRealm(input.type, input.realm, found) == kSuccess) {
        Log(6, "ERROR: Credential already existed.");
        return true;
    }
    if (findCredentialByName(name, found) == kSuccess) {
        Log(6, "ERROR: Found duplicate credential name.");
        return true;
    }
    return false;
}

// An id at the limit could not be followed by another.
ResultCode CredentialTable::addCredential(const CredentialInput& input, std::int32_t nextId,
                                          const std::wstring& userName, std::int32_t& outId) {
    outId = -1;
    if (input.type == 0) {
        Log(6, "ERROR: Invalid credential type.");
        return kInvalidArgument;
    }
    const std::wstring& name = input.credName.empty() ? input.realm : input.credName;
    if (isDuplicate(input, name)) return kFailure;
    const std::wstring& creator = input.creator.empty() ? userName : input.creator;
    if (creator.empty()) {
        Log(6, "ERROR: Invalid credential creator.");
        return kFailure;
    }
    if (nextId == kLargestPriority) {
        Log(6, "ERROR: No credential id is left.");
        return kFailure;
    }
    const std::int32_t accessType = input.accessType == 0 ? CRED_ACCESS_ALL_USER : input.accessType;
    auto record = makeRecord(nextId, creator, input.type, accessType);
    if (!record) return kOutOfMemory;
    if (!applyTexts(*record, input, name)) {
        Log(2, "Unknown credential type.");
        return kFailure;
    }
    record->m_eapMethod = input.type == CRED_TYPE_EAP_TTLS ? kEapMethodTtls : kEapMethodTls;
    insertCredential(std::move(record));
    outId = nextId;
    return kSuccess;
}

void CredentialTable::insertCredential(std::unique_ptr<Credential> record) {
    m_list.reserve(m_list.size() + 1);
    record->m_edition = nextEdition();
    record->m_priority = CRED_PRIORITY_HIGHEST;
    makeRoomAtTop();
    m_list.push_back(std::move(record));
    sortByPriority();
}

bool CredentialTable::shiftPlacedDown() {
    for (const auto& credential : m_list) {
        if (!isPlaced(*credential)) continue;
        if (credential->m_priority == kLargestPriority) return false;
        ++credential->m_priority;
    }
    return true;
}

void CredentialTable::makeRoomAtTop() {
    if (shiftPlacedDown()) sortByPriority();
}

ResultCode CredentialTable::updateCredential(const CredentialInput& input) {
    if (input.id < 1) return kInvalidArgument;
    const Credential* const credential = findCredentialById(input.id);
    if (credential == nullptr) return kFailure;
    const bool isTtls = credential->m_type == CRED_TYPE_EAP_TTLS;
    const bool isTls = credential->m_type == CRED_TYPE_EAP_TLS;
    if (!isTtls && !isTls) {
        Log(2, "Invalid credential type.");
        return kInvalidArgument;
    }
    if (input.realm.empty()) return kFailure;
    if (isTtls && (input.username.empty() || input.password.empty())) return kFailure;
    Credential changed = *credential;
    applyTexts(changed, input, input.credName);
    replace(*credential, std::move(changed));
    return kSuccess;
}

bool CredentialTable::deleteCredential(std::int32_t id) {
    if (id < 1) return false;
    const auto found = std::find_if(m_list.begin(), m_list.end(),
                                    [id](const auto& credential) { return credential->m_id == id; });
    if (found == m_list.end()) return true;
    const std::int32_t freed = (*found)->m_priority;
    const auto next = m_list.erase(found);
    if (freed != 0)
        for (auto behind = next; behind != m_list.end(); ++behind)
            if ((*behind)->m_priority != 0 && (*behind)->m_priority > freed) --(*behind)->m_priority;
    sortByPriority();
    return true;
}

bool CredentialTable::setCredentialPosition(std::int32_t id, std::int32_t position) {
    if (position > CRED_PRIORITY_LOWEST || position < CRED_PRIORITY_HIGHEST || m_list.empty()) return false;
    std::int32_t target = std::max(position, m_list.front()->m_priority);
    target = std::min(target, m_list.back()->m_priority);
    if (target == 0) return false;
    const Credential* const moved = findCredentialById(id);
    if (moved == nullptr) return false;
    if (moved->m_priority == target) return true;
    if (moved->m_priority > target)
        moveTowardsTop(*moved, target);
    else
        moveTowardsEnd(*moved, target);
    setPriority(*moved, target);
    sortByPriority();
    return true;
}

void CredentialTable::moveTowardsTop(const Credential& moved, std::int32_t target) {
    bool isShifting = false;
    for (const auto& credential : m_list) {
        if (credential.get() == &moved) return;
        isShifting = isShifting || credential->m_priority == target;
        if (isShifting && credential->m_priority < kLargestPriority) ++credential->m_priority;
    }
}

void CredentialTable::moveTowardsEnd(const Credential& moved, std::int32_t target) {
    bool isShifting = false;
    for (const auto& credential : m_list) {
        if (isShifting) {
            if (credential->m_priority > 0) --credential->m_priority;
            if (credential->m_priority == target - 1) return;
        }
        isShifting = isShifting || credential.get() == &moved;
    }
}

ResultCode CredentialTable::findCredentialByName(const std::wstring& name, const Credential*& out) const {
    const auto found = std::find_if(m_list.begin(), m_list.end(),
                                    [&](const auto& credential) { return credential->m_credName == name; });
    out = found == m_list.end() ? nullptr : found->get();
    return out == nullptr ? kNotFound : kSuccess;
}

ResultCode CredentialTable::findCredentialByTypeAndRealm(std::int32_t type, const std::wstring& realm,
                                                         const Credential*& out) const {
    const auto found = std::find_if(m_list.begin(), m_list.end(), [&](const auto& credential) {
        return credential->m_type == type && credential->m_realm == realm;
    });
    out = found == m_list.end() ? nullptr : found->get();
    return out == nullptr ? kNotFound : kSuccess;
}

const Credential* CredentialTable::findCredentialById(std::int32_t id) const {
    const auto found = std::find_if(m_list.begin(), m_list.end(),
                                    [id](const auto& credential) { return credential->m_id == id; });
    return found == m_list.end() ? nullptr : found->get();
}

std::vector<const Credential*> CredentialTable::copyCredentialPointers() const {
    std::vector<const Credential*> pointers;
    pointers.reserve(m_list.size());
    for (const auto& credential : m_list)
        pointers.push_back(credential.get());
    return pointers;
}

std::unordered_map<std::int32_t, const Credential*> CredentialTable::credentialsById() const {
    std::unordered_map<std::int32_t, const Credential*> byId;
    for (const auto& credential : m_list)
        byId.try_emplace(credential->m_id, credential.get());
    return byId;
}

// Others may only look at what a table holds: what is changed gets its edition here.
Credential& CredentialTable::own(const Credential& stored) {
    return const_cast<Credential&>(stored);
}

void CredentialTable::replace(const Credential& stored, Credential by) {
    by.m_priority = stored.m_priority;
    by.m_edition = nextEdition();
    own(stored) = std::move(by);
}

void CredentialTable::setId(const Credential& stored, std::int32_t id) {
    own(stored).m_id = id;
    own(stored).m_edition = nextEdition();
}

void CredentialTable::setPriority(const Credential& stored, std::int32_t priority) {
    own(stored).m_priority = priority;
}

void CredentialTable::appendUnplaced(std::unique_ptr<Credential> record) {
    record->m_priority = CRED_PRIORITY_LOWEST;
    record->m_edition = nextEdition();
    m_list.push_back(std::move(record));
}

bool CredentialTable::placeUnplacedCredentials() {
    for (std::size_t i = m_list.size(); i-- > 0;) {
        if (m_list[i]->m_priority != CRED_PRIORITY_LOWEST) continue;
        if (!shiftPlacedDown()) return false;
        m_list[i]->m_priority = CRED_PRIORITY_HIGHEST;
    }
    sortByPriority();
    return true;
}

void CredentialTable::sortByPriority() {
    std::stable_sort(m_list.begin(), m_list.end(),
                     [](const auto& a, const auto& b) { return a->m_priority < b->m_priority; });
}

void CredentialTable::dumpCredentials() const {
    Log(2, "\tDumping all credentials...");
    for (const auto& credential : m_list)
        Log(3, "Credential: id=%d, name=%s, priority=%d", credential->m_id,
            narrowFromWide(credential->m_credName).c_str(), credential->m_priority);
}

}  // namespace vexa
