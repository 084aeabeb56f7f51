#include "config/StoreText.h"

#include <algorithm>
#include <array>
#include <cstdint>
#include <string_view>

#include "base/DiagnosticLog.h"
#include "text/TextConversion.h"
#include "text/XmlWellFormed.h"

namespace vexa {

namespace {

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

// A carriage return as it stands would be read as a line end.
const char* reference(char character) {
    switch (character) {
        case '&':
            return "&amp;";
        case '<':
            return "&lt;";
        case '>':
            return "&gt;";
        default:
            return "&#13;";
    }
}

void appendEscaped(std::string& text, std::wstring_view wide) {
    const std::string utf8 = utf8FromWide(wide);
    std::string_view rest = utf8;
    for (std::size_t at = rest.find_first_of("&<>\r"); at != rest.npos; at = rest.find_first_of("&<>\r")) {
        text.append(rest.substr(0, at)).append(reference(rest[at]));
        rest.remove_prefix(at + 1);
    }
    text.append(rest);
}

void appendTag(std::string& text, const char* beginning, const char* tag) {
    text.append(beginning).append(tag).append(">");
}

void appendElement(std::string& text, const char* tag, std::wstring_view content) {
    appendTag(text, "<", tag);
    appendEscaped(text, content);
    appendTag(text, "</", tag);
}

void appendElement(std::string& text, const char* tag, std::int32_t number) {
    appendTag(text, "<", tag);
    text.append(std::to_string(number));
    appendTag(text, "</", tag);
}

// The two that only a credential of its type has.
struct OwnText {
    const char* tag;
    const std::wstring& content;
};

std::array<OwnText, 2> ownTexts(const Credential& credential) {
    if (credential.m_type == CRED_TYPE_EAP_TTLS)
        return {OwnText{"username", credential.m_username}, OwnText{"password", credential.m_password}};
    return {OwnText{"cacert", credential.m_caCert}, OwnText{"clientcert", credential.m_clientCert}};
}

}  // namespace

bool canBeWritten(const Credential& credential) {
    const auto own = ownTexts(credential);
    return canStandInXml(credential.m_credName) && canStandInXml(credential.m_realm) &&
           std::all_of(own.begin(), own.end(), [](const OwnText& one) { return canStandInXml(one.content); });
}

void appendCredentialText(std::string& text, const Credential& credential, const std::wstring& creator) {
    text.append("<credential>");
    appendElement(text, "id", credential.m_id);
    appendElement(text, "type", textOfType(credential.m_type));
    appendElement(text, "accesstype", textOfAccess(credential.m_accessType));
    appendElement(text, "creator", creator);
    appendElement(text, "eap", credential.m_eapMethod);
    appendElement(text, "autoconnect", credential.m_bAutoConnect ? L"true" : L"false");
    if (credential.m_type == CRED_TYPE_EAP_TTLS || credential.m_type == CRED_TYPE_EAP_TLS) {
        appendElement(text, "credname", credential.m_credName);
        appendElement(text, "realm", credential.m_realm);
        for (const auto& [tag, content] : ownTexts(credential))
            appendElement(text, tag, content);
    } else {
        Log(2, "Invalid credential type.");
    }
    text.append("</credential>");
}

void appendUserText(std::string& text, const std::wstring& userName,
                    const std::vector<const Credential*>& credentials) {
    text.append("<user>");
    appendElement(text, "username", userName);
    text.append("<credentials>");
    for (const Credential* credential : credentials) {
        text.append("<credential><id>").append(std::to_string(credential->m_id));
        text.append("</id><priority>").append(std::to_string(credential->m_priority));
        text.append("</priority></credential>");
    }
    text.append("</credentials></user>");
}

}  // namespace vexa
