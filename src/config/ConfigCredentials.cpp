#include <algorithm>
#include <limits>
#include <memory>
#include <string>

#include "base/DiagnosticLog.h"
#include "config/Config.h"
#include "text/ScopeGuard.h"
#include "text/TextConversion.h"

namespace vexa {

namespace {

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

ResultCode Config::readCredentials() {
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

void Config::readCredential(Node node) {
    const std::int32_t id = numberOf(node, "id");
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

ResultCode Config::saveCredentials() {
    const ScopeGuard release([this]() NO_THREAD_SAFETY_ANALYSIS { m_xmlDoc.release(); });
    if (const ResultCode result = openDocument(); result != kSuccess) return result;
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
    const std::int32_t id = numberOf(node, "id");
    if (id <= 0) {
        Log(2, "Invalid credential id=%d", id);
        return false;
    }
    const std::wstring access = textOf(node, "accesstype", kInvalid);
    const std::wstring creator = textOf(node, "creator", kInvalid);
    return present.contains(id) || accessFromText(access) != CRED_ACCESS_PER_USER || creator == m_userName;
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
