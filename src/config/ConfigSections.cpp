#include <algorithm>
#include <limits>
#include <memory>
#include <string>
#include <unordered_set>

#include "base/DiagnosticLog.h"
#include "config/Config.h"
#include "text/ScopeGuard.h"
#include "text/TextConversion.h"

namespace vexa {

namespace {

constexpr const wchar_t* kInvalid = L"Invalid";

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

std::wstring Config::textOf(Node node, const char* child, const wchar_t* missing) {
    return m_xmlDoc.getText(child, node).value_or(missing);
}

int Config::readCredentials() {
    Log(2, "Reading all credentials...");
    m_credentials.clear();
    if (m_userName.empty()) return kFailure;
    std::vector<Node> nodes;
    if (m_xmlDoc.selectNodes("/*/credentials/*", Node(), nodes) != kSuccess) return kFailure;
    Log(2, "Retrieved total %d credentials:", static_cast<int>(nodes.size()));
    int index = 0;
    for (const Node node : nodes) {
        Log(2, "\tReading credential with index=%d...", ++index);
        readCredential(node);
    }
    m_credentials.sortByPriority();
    if (m_nextCredId <= 0) repairNextCredId();
    return kSuccess;
}

// An empty number counts as a missing one.
void Config::readCredential(Node node) {
    const std::wstring idText = textOf(node, "id", L"");
    const std::int32_t id = idText.empty() ? -1 : leadingInteger(idText);
    if (id <= 0) {
        Log(2, "Invalid credential id=%d", id);
        return;
    }
    const std::int32_t type = typeFromText(textOf(node, "type", kInvalid));
    const std::int32_t access = accessFromText(textOf(node, "accesstype", kInvalid));
    if (type == 0 || access == 0) return;
    const std::wstring creator = textOf(node, "creator", kInvalid);
    if (access == CRED_ACCESS_PER_USER && creator != m_userName) return;

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
    m_credentials.appendUnplaced(std::move(credential));
}

// One above the highest id in the file, other users' credentials included, so that no id is given out twice.
// Only in memory.
void Config::repairNextCredId() {
    std::vector<Node> nodes;
    m_xmlDoc.selectNodes("/*/credentials/*", Node(), nodes);
    std::int32_t highest = 0;
    for (const Node node : nodes)
        highest = std::max(highest, leadingInteger(textOf(node, "id", L"")));
    m_nextCredId = highest == std::numeric_limits<std::int32_t>::max() ? highest : highest + 1;
}

int Config::readUsers(bool* configChanged) {
    Log(2, "Reading all user info...");
    if (configChanged != nullptr) *configChanged = false;
    if (m_userName.empty()) return kFailure;
    std::vector<Node> users;
    if (m_xmlDoc.selectNodes("/*/users/*", Node(), users) != kSuccess) return kFailure;
    Log(2, "Retrieved total %d user info", static_cast<int>(users.size()));
    bool isChanged = false;
    if (const Node user = findCurrentUser(users)) {
        std::vector<Node> references;
        if (m_xmlDoc.selectNodes("credentials/*", user, references) != kSuccess) return kFailure;
        Log(2, "\t\tcredential count=%d", static_cast<int>(references.size()));
        isChanged = applyReferences(references);
    }
    m_credentials.placeUnplacedCredentials();
    m_credentials.dumpCredentials();
    if (configChanged != nullptr) *configChanged = isChanged;
    return kSuccess;
}

Config::Node Config::findCurrentUser(const std::vector<Node>& users) {
    int index = 0;
    for (const Node user : users) {
        Log(2, "\tReading user info with index=%d...", ++index);
        if (textOf(user, "username", kInvalid) == m_userName) return user;
    }
    return {};
}

// The user's places, one by one. True if others have deleted credentials that he lists, or added some that he
// doesn't.
bool Config::applyReferences(const std::vector<Node>& references) {
    const auto present = m_credentials.credentialsById();
    std::unordered_set<std::int32_t> listed;
    bool isChanged = false;
    for (const Node reference : references) {
        const std::wstring idText = textOf(reference, "id", L"");
        const std::int32_t id = idText.empty() ? -1 : leadingInteger(idText);
        if (id <= 0) continue;
        listed.insert(id);
        const std::wstring priorityText = textOf(reference, "priority", L"");
        const std::int32_t priority = priorityText.empty() ? -1 : leadingInteger(priorityText);
        if (priority < 0) continue;
        const auto found = present.find(id);
        if (found != present.end()) {
            found->second->m_priority = priority;
            Log(2, "\t\t\tid=%d, priority=%d", id, priority);
        } else {
            Log(3,
                "All-user credential deleted by others,we should delete this credential for current user, cred id=%d",
                id);
            isChanged = true;
        }
    }
    const auto all = m_credentials.copyCredentialPointers();
    return isChanged || std::any_of(all.begin(), all.end(), [&](const Credential* credential) {
               return !listed.contains(credential->m_id);
           });
}

int Config::saveCredentials() {
    const ScopeGuard release([this]() NO_THREAD_SAFETY_ANALYSIS { m_xmlDoc.release(); });
    if (const int result = openDocument(); result != kSuccess) return result;
    Node section;
    std::vector<Node> nodes;
    if (m_xmlDoc.selectSingleNode("/*/credentials", Node(), section) != kSuccess ||
        m_xmlDoc.selectNodes("/*/credentials/*", Node(), nodes) != kSuccess)
        return kFailure;
    const auto present = m_credentials.credentialsById();
    for (const Node node : nodes)
        if (mustRemove(node, present)) XmlDocument::remove(node);
    for (const Credential* credential : m_credentials.copyCredentialPointers())
        if (!section || writeCredential(*credential, section) != kSuccess) return kFailure;
    Log(2, "Saving credentials to xml file...");
    saveDocument();
    return kSuccess;
}

// What the table holds is written anew. Of the rest only what this process never loaded stays: other users'
// private credentials, and what has no valid id.
bool Config::mustRemove(Node node, const std::unordered_map<std::int32_t, Credential*>& present) {
    const std::wstring idText = textOf(node, "id", L"");
    const std::int32_t id = idText.empty() ? -1 : leadingInteger(idText);
    if (id <= 0) {
        Log(2, "Invalid credential id=%d", id);
        return false;
    }
    const std::wstring access = textOf(node, "accesstype", kInvalid);
    const std::wstring creator = textOf(node, "creator", kInvalid);
    return present.contains(id) || accessFromText(access) != CRED_ACCESS_PER_USER || creator == m_userName;
}

int Config::writeCredential(const Credential& credential, Node section) {
    Node node;
    if (m_xmlDoc.setChild("credential", L"", section, true, &node) != kSuccess) return kFailure;
    int result = kSuccess;
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

int Config::saveUsers() {
    if (m_userName.empty()) return kFailure;
    const ScopeGuard release([this]() NO_THREAD_SAFETY_ANALYSIS { m_xmlDoc.release(); });
    if (m_xmlDoc.create() != kSuccess || m_xmlDoc.load(m_configPath) != kSuccess) return kFailure;
    Node section;
    std::vector<Node> users;
    if (m_xmlDoc.selectSingleNode("/*/users", Node(), section) != kSuccess || !section ||
        m_xmlDoc.selectNodes("/*/users/*", Node(), users) != kSuccess)
        return kFailure;
    for (const Node user : users)
        if (textOf(user, "username", kInvalid) == m_userName) XmlDocument::remove(user);
    Node user;
    Node list;
    if (m_xmlDoc.setChild("user", L"", section, true, &user) != kSuccess ||
        m_xmlDoc.setChild("username", m_userName, user, true) != kSuccess ||
        m_xmlDoc.setChild("credentials", L"", user, true, &list) != kSuccess ||
        writeReferences(list) != kSuccess)
        return kFailure;
    saveDocument();
    return kSuccess;
}

int Config::writeReferences(Node list) {
    for (const Credential* credential : m_credentials.copyCredentialPointers()) {
        Node reference;
        if (m_xmlDoc.setChild("credential", L"", list, true, &reference) != kSuccess) return kFailure;
        m_xmlDoc.setChild("id", std::to_wstring(credential->m_id), reference, true);
        m_xmlDoc.setChild("priority", std::to_wstring(credential->m_priority), reference, true);
    }
    return kSuccess;
}

}  // namespace vexa
