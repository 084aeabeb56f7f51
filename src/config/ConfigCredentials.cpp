#include <algorithm>
#include <limits>
#include <memory>
#include <string>
#include <utility>

#include "base/DiagnosticLog.h"
#include "config/Config.h"
#include "text/TextConversion.h"

namespace vexa {

namespace {

constexpr std::int32_t kLargestId = std::numeric_limits<std::int32_t>::max();

std::int32_t typeFromText(const std::wstring& text) {
    if (text == L"eapttls") return CRED_TYPE_EAP_TTLS;
    if (text == L"eaptls") return CRED_TYPE_EAP_TLS;
    return 0;
}

std::int32_t accessFromText(const std::wstring& text) {
    if (text == L"alluser") return CRED_ACCESS_ALL_USER;
    if (text == L"peruser") return CRED_ACCESS_PER_USER;
    return 0;
}

}  // namespace

ResultCode Config::readCredentials(Reading& reading, bool& isChanged) {
    const bool isTraced = reading.trace == Trace::Yes;
    if (isTraced) Log(2, "Reading all credentials...");
    reading.table.clear();
    if (m_userName.empty()) return kFailure;
    std::vector<Node> nodes;
    if (m_xmlDoc.selectNodes("/*/credentials/*", Node(), nodes) != kSuccess) return kFailure;
    if (isTraced) Log(2, "Retrieved total %d credentials:", static_cast<int>(nodes.size()));
    int index = 0;
    for (const Node node : nodes) {
        ++index;
        if (isTraced) Log(2, "\tReading credential with index=%d...", index);
        readCredential(node, reading);
    }
    reading.table.sortByPriority();
    isChanged = repairIds(reading);
    return kSuccess;
}

// Seen by its creator alone, who is somebody else.
bool Config::isForeign(std::int32_t access, const std::wstring& creator) const {
    return access == CRED_ACCESS_PER_USER && creator != m_userName;
}

bool Config::isForeign(Node node) {
    return isForeign(accessFromText(textOf(node, "accesstype", kInvalid)), textOf(node, "creator", kInvalid));
}

void Config::readCredential(Node node, Reading& reading) {
    const std::int32_t id = numberOf(node, "id");
    if (id <= 0) {
        if (reading.trace == Trace::Yes) Log(2, "Invalid credential id=%d", id);
        return;
    }
    reading.highestId = std::max(reading.highestId, id);
    const std::int32_t type = typeFromText(textOf(node, "type", kInvalid));
    const std::int32_t access = accessFromText(textOf(node, "accesstype", kInvalid));
    const std::wstring creator = textOf(node, "creator", kInvalid);
    const bool isOthers = isForeign(access, creator);
    if (isOthers) reading.foreignIds.insert(id);
    if (type == 0 || access == 0 || isOthers) return;

    auto credential = std::make_unique<Credential>(id, creator, type, access);
    credential->m_bAutoConnect = textOf(node, "autoconnect", L"true") == L"true";
    credential->m_credName = textOf(node, "credname", L"");
    credential->m_realm = textOf(node, "realm", L"");
    if (type == CRED_TYPE_EAP_TTLS) {
        credential->m_username = textOf(node, "username", L"");
        credential->m_password = textOf(node, "password", L"");
    } else {
        credential->m_caCert = textOf(node, "cacert", L"");
        credential->m_clientCert = textOf(node, "clientcert", L"");
    }
    const std::wstring eap = textOf(node, "eap", L"");
    const std::int32_t missingEap = type == CRED_TYPE_EAP_TTLS ? 0 : kEapMethodTls;
    credential->m_eapMethod = eap.empty() ? missingEap : leadingInteger(eap);
    if (credential->m_credName.empty()) credential->m_credName = credential->m_realm;
    reading.table.appendUnplaced(std::move(credential));
}

std::int32_t Config::followingId(std::int32_t id) {
    return id == kLargestId ? id : id + 1;
}

// The next id is above all ids in the file, other users' included, whatever the file says; it never goes
// back. An id that is there twice stays with another user, or with the first that has it.
bool Config::repairIds(const Reading& reading) {
    std::int32_t next = std::max(readNumber("/*/global/nextcredid"), followingId(reading.highestId));
    std::unordered_set<std::int32_t> taken = reading.foreignIds;
    bool isChanged = false;
    for (const Credential* credential : reading.table.copyCredentialPointers()) {
        if (taken.insert(credential->m_id).second || next == kLargestId) continue;
        if (reading.trace == Trace::Yes)
            Log(6, "ERROR: Found duplicate credential id=%d, new id=%d", credential->m_id, next);
        if (reading.foreignIds.contains(credential->m_id)) m_renamed[credential->m_id] = next;
        CredentialTable::setId(*credential, next);
        next = followingId(next);
        isChanged = true;
    }
    m_nextCredId = std::max(m_nextCredId, next);
    return isChanged;
}

}  // namespace vexa
