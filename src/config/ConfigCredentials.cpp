#include <algorithm>
#include <limits>
#include <memory>
#include <string>

#include "base/DiagnosticLog.h"
#include "config/Config.h"
#include "text/TextConversion.h"

namespace vexa {

namespace {

constexpr std::int32_t kLargest = std::numeric_limits<std::int32_t>::max();

std::int32_t typeFromText(const std::wstring& text) {
    if (text == L"eapttls") return CRED_TYPE_EAP_TTLS;
    if (text == L"eaptls") return CRED_TYPE_EAP_TLS;
    return 0;
}

const wchar_t* textOfType(std::int32_t type) {
    switch (type) {
        case CRED_TYPE_EAP_TTLS:
            return L"eapttls";
        case CRED_TYPE_EAP_SIM:
            return L"eapsim";
        case CRED_TYPE_EAP_TLS:
            return L"eaptls";
        default:
            return L"invalid";
    }
}

std::int32_t accessFromText(const std::wstring& text) {
    if (text == L"alluser") return CRED_ACCESS_ALL_USER;
    if (text == L"peruser") return CRED_ACCESS_PER_USER;
    return 0;
}

const wchar_t* textOfAccess(std::int32_t accessType) {
    switch (accessType) {
        case CRED_ACCESS_ALL_USER:
            return L"alluser";
        case CRED_ACCESS_PER_USER:
            return L"peruser";
        default:
            return L"invalid";
    }
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
    if (isForeign(access, creator)) reading.foreignIds.insert(id);
    if (type == 0 || access == 0 || isForeign(access, creator)) return;

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
    return id == kLargest ? id : id + 1;
}

// The next id is above all ids in the file, other users' included, whatever the file says; it never goes
// back. An id that is there twice stays with another user, or with the first that has it.
bool Config::repairIds(const Reading& reading) {
    std::int32_t next = std::max(readNumber("/*/global/nextcredid"), followingId(reading.highestId));
    std::unordered_set<std::int32_t> taken = reading.foreignIds;
    bool isChanged = false;
    for (Credential* credential : reading.table.copyCredentialPointers()) {
        if (taken.insert(credential->m_id).second || next == kLargest) continue;
        if (reading.trace == Trace::Yes)
            Log(6, "ERROR: Found duplicate credential id=%d, new id=%d", credential->m_id, next);
        if (reading.foreignIds.contains(credential->m_id)) m_renamed[credential->m_id] = next;
        credential->m_id = next;
        next = followingId(next);
        isChanged = true;
    }
    m_nextCredId = std::max(m_nextCredId, next);
    return isChanged;
}

// What was there is taken out last, so that a failure changes nothing.
ResultCode Config::writeCredentials() {
    Node section;
    std::vector<Node> nodes;
    if (m_xmlDoc.selectSingleNode("/*/credentials", Node(), section) != kSuccess ||
        m_xmlDoc.selectNodes("/*/credentials/*", Node(), nodes) != kSuccess)
        return kFailure;
    std::erase_if(nodes, [this](Node node) NO_THREAD_SAFETY_ANALYSIS { return !mustRemove(node); });
    const Node last = section.last_child();
    ResultCode result = kSuccess;
    for (const Credential* credential : m_credentials.copyCredentialPointers())
        if (result == kSuccess) result = section ? writeCredential(*credential, section) : kFailure;
    while (result != kSuccess && section.last_child() != last)
        XmlDocument::remove(section.last_child());
    if (result != kSuccess) return result;
    for (const Node node : nodes)
        XmlDocument::remove(node);
    Log(2, "Saving credentials to xml file...");
    return kSuccess;
}

// Only what this process never loaded stays: other users' private credentials, and what has no valid id.
// Whatever the ids of those are, they are no reason to take them for the user's own.
bool Config::mustRemove(Node node) {
    const std::int32_t id = numberOf(node, "id");
    if (id <= 0) Log(2, "Invalid credential id=%d", id);
    const std::int32_t access = accessFromText(textOf(node, "accesstype", kInvalid));
    return id > 0 && !isForeign(access, textOf(node, "creator", kInvalid));
}

ResultCode Config::writeCredential(const Credential& credential, Node section) {
    Node node;
    if (m_xmlDoc.setChild("credential", L"", section, true, &node) != kSuccess) return kFailure;
    ResultCode result = kSuccess;
    const auto write = [&](const char* tag, const std::wstring& text) NO_THREAD_SAFETY_ANALYSIS {
        if (m_xmlDoc.setChild(tag, text, node, true) != kSuccess) result = kFailure;
    };
    write("id", std::to_wstring(credential.m_id));
    write("type", textOfType(credential.m_type));
    write("accesstype", textOfAccess(credential.m_accessType));
    write("creator", m_userName);
    write("eap", std::to_wstring(credential.m_eapMethod));
    write("autoconnect", credential.m_bAutoConnect ? L"true" : L"false");
    const bool isTtls = credential.m_type == CRED_TYPE_EAP_TTLS;
    if (!isTtls && credential.m_type != CRED_TYPE_EAP_TLS) {
        Log(2, "Invalid credential type.");
        return result;
    }
    write("credname", credential.m_credName);
    write("realm", credential.m_realm);
    write(isTtls ? "username" : "cacert", isTtls ? credential.m_username : credential.m_caCert);
    write(isTtls ? "password" : "clientcert", isTtls ? credential.m_password : credential.m_clientCert);
    return result;
}

}  // namespace vexa
