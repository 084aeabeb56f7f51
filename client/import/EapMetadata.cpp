#include "client/import/EapMetadata.h"

#include <algorithm>
#include <array>
#include <optional>

#include "client/import/Certificate.h"
#include "client/import/ForeignXml.h"
#include "client/import/MetadataNotes.h"
#include "client/terminal/ClientError.h"
#include "client/terminal/Text.h"
#include "contract/Realm.h"
#include "text/OneOf.h"
#include "text/TextConversion.h"

namespace vexa::client {

namespace {

/// Numbers of methods that are registered, as a file may name them.
struct MethodName {
    int number;
    const char* name;
};
constexpr std::array kEapMethods{
    MethodName{13, "EAP-TLS"},  MethodName{18, "EAP-SIM"},  MethodName{21, "EAP-TTLS"},
    MethodName{23, "EAP-AKA"},  MethodName{25, "PEAP"},     MethodName{26, "EAP-MSCHAPv2"},
    MethodName{43, "EAP-FAST"}, MethodName{50, "EAP-AKA'"}, MethodName{52, "EAP-pwd"},
    MethodName{55, "TEAP"},     MethodName{6, "EAP-GTC"}};
constexpr std::array kOtherMethods{MethodName{1, "PAP"}, MethodName{2, "MSCHAP"}, MethodName{3, "MSCHAPv2"}};
constexpr std::array kPasswordMethods{"PAP", "MSCHAPv2", "EAP-MSCHAPv2"};

template <std::size_t N>
std::string nameAmong(const std::array<MethodName, N>& methods, const std::string& number) {
    const auto found = std::find_if(methods.begin(), methods.end(), [&](const MethodName& method) {
        return std::to_string(method.number) == number;
    });
    return found == methods.end() ? "the EAP method " + inQuotes(number) : found->name;
}

std::string behindAt(const std::string& text) {
    const std::size_t at = text.rfind('@');
    return at == std::string::npos ? "" : text.substr(at + 1);
}

pugi::xml_node childOf(pugi::xml_node parent, const char* name) {
    return parent.find_child(
        [&](pugi::xml_node node) { return node.type() == pugi::node_element && localName(node) == name; });
}

std::vector<pugi::xml_node> childrenOf(pugi::xml_node parent, const char* name) {
    std::vector<pugi::xml_node> found;
    for (const pugi::xml_node node : parent.children()) {
        if (node.type() == pugi::node_element && localName(node) == name) found.push_back(node);
    }
    return found;
}

/// What a method of the provider says of the user, and of the server's certificates.
struct Method {
    int type = kTypeUser;
    std::string username;
    std::string password;
    std::string suffix;
    bool wantsSuffix = false;
    std::string outerRealm;
    std::string caCert;
};

class ProviderReader {
public:
    ProviderReader(pugi::xml_node provider, std::size_t index)
        : m_provider(provider), m_index(index), m_name(displayName()), m_notes(shownName()) {}

    void readInto(CredentialFile& file) {
        for (const pugi::xml_node node : childrenOf(m_provider, "AuthenticationMethods")) {
            for (const pugi::xml_node method : childrenOf(node, "AuthenticationMethod"))
                readMethod(method);
        }
        nameAll();
        for (FiledCredential& filed : m_found) {
            const auto objection = objectionToFiled(filed.credential);
            if (objection)
                m_notes.tell(methodOf(filed.credential), *objection);
            else
                file.credentials.push_back(std::move(filed));
        }
        for (const pugi::xml_node info : childrenOf(m_provider, "ProviderInfo")) {
            for (const pugi::xml_node name : childrenOf(info, "DisplayName"))
                m_notes.take(name);
        }
        m_notes.tellRest(m_provider);
        file.notes.insert(file.notes.end(), m_notes.lines().begin(), m_notes.lines().end());
    }

private:
    std::string displayName() const {
        return textOf(childOf(childOf(m_provider, "ProviderInfo"), "DisplayName"));
    }

    std::string shownName() const { return m_name.empty() ? m_provider.attribute("ID").value() : m_name; }

    static std::optional<std::string> objectionToFiled(const Credential& credential) {
        if (auto objection = objectionTo(credential)) return objection;
        if (contract::realmBytes(wideFromUtf8(credential.realm))) return std::nullopt;
        return "its realm holds a character beyond Latin-1, which no network's can be compared with";
    }

    static std::string methodOf(const Credential& credential) { return "EAP-" + methodName(credential); }

    /// The text of an element that needs no word any more.
    std::string taken(pugi::xml_node node) {
        if (node) m_notes.take(node);
        return textOf(node);
    }

    void readMethod(pugi::xml_node node) {
        const auto eapMethod = childOf(node, "EAPMethod");
        const std::string type = nameAmong(kEapMethods, taken(childOf(eapMethod, "Type")));
        const bool isTls = type == "EAP-TLS";
        if (!isTls && type != "EAP-TTLS") return refuse(node, type, "the service has EAP-TTLS and EAP-TLS");
        const auto inner = childOf(node, "InnerAuthenticationMethod");
        if (inner && !isTls && !readInner(node, inner)) return;
        Method method;
        method.type = isTls ? kTypeCertificate : kTypeUser;
        for (const pugi::xml_node place : {inner, node})
            readClientSide(place, method);
        if (isTls && !readAuthority(node, method)) return;
        store(node, method);
    }

    // Nothing else that stands in it is worth a word.
    void refuse(pugi::xml_node node, const std::string& what, const std::string& reason) {
        m_notes.take(node);
        m_notes.tell(what, reason);
    }

    /// False: the method has no use for a password.
    bool readInner(pugi::xml_node node, pugi::xml_node inner) {
        const auto eap = childOf(inner, "EAPMethod");
        const auto other = childOf(inner, "NonEAPAuthMethod");
        const std::string name = eap ? nameAmong(kEapMethods, textOf(childOf(eap, "Type")))
                                     : nameAmong(kOtherMethods, textOf(childOf(other, "Type")));
        if (!isOneOf(kPasswordMethods, name)) {
            refuse(node, "EAP-TTLS with " + name, "the service has it with PAP and MSCHAPv2");
            return false;
        }
        for (const pugi::xml_node kind : {eap, other})
            taken(childOf(kind, "Type"));
        m_notes.tell("the inner method " + name, "the adapter's software chooses it");
        return true;
    }

    void readClientSide(pugi::xml_node place, Method& method) {
        const auto side = childOf(place, "ClientSideCredential");
        const auto fill = [&](std::string& text, const char* name) {
            if (text.empty()) text = taken(childOf(side, name));
        };
        fill(method.suffix, "InnerIdentitySuffix");
        if (method.suffix.starts_with('@')) method.suffix.erase(0, 1);
        if (method.type == kTypeUser) {
            fill(method.username, "UserName");
            fill(method.password, "Password");
            const std::string hint = taken(childOf(side, "InnerIdentityHint"));
            method.wantsSuffix = method.wantsSuffix || hint == "true" || hint == "1";
        }
        readOuterIdentity(childOf(side, "OuterIdentity"), method);
        if (std::string(side.attribute("allow_save").value()) == "false")
            m_notes.tell("the wish that nothing of the user be saved", "the service asks for nothing later");
    }

    // The user of what the service sends is the same.
    void readOuterIdentity(pugi::xml_node node, Method& method) {
        const std::string identity = textOf(node);
        if (method.outerRealm.empty()) method.outerRealm = behindAt(identity);
        if (method.type == kTypeUser && identity.starts_with("anonymous@")) m_notes.take(node);
    }

    /// False: there is an authority, but none that can be read, and without it any server would do.
    bool readAuthority(pugi::xml_node node, Method& method) {
        bool isNamed = false;
        bool isRoot = false;
        std::size_t more = 0;
        for (const pugi::xml_node ca : childrenOf(childOf(node, "ServerSideCredential"), "CA")) {
            isNamed = true;
            const auto certificates = readCertificates(textOf(ca));
            if (certificates.empty()) m_notes.tell("a CA", "no certificate can be read in it");
            for (const Certificate& certificate : certificates) {
                if (!method.caCert.empty()) ++more;
                if (!method.caCert.empty() && (isRoot || !certificate.isSelfIssued)) continue;
                method.caCert = certificate.thumbprint;
                isRoot = certificate.isSelfIssued;
            }
            m_notes.take(ca);
        }
        if (more > 0)
            m_notes.tell(counted(more, "more CA certificate"),
                         "a credential for EAP-TLS names one authority");
        if (!isNamed || !method.caCert.empty()) return true;
        refuse(node, "EAP-TLS", "its authority is not known, and without one any server would do");
        return false;
    }

    std::vector<std::string> realmsOf(const Method& method) const {
        std::vector<std::string> realms;
        const auto append = [&](const std::string& realm) {
            if (!realm.empty() && !isOneOf(realms, realm)) realms.push_back(realm);
        };
        append(method.suffix);
        append(method.outerRealm);
        if (realms.empty()) append(behindAt(method.username));
        const std::string kind = m_provider.attribute("namespace").value();
        if (realms.empty() && kind == "urn:RFC4282:realm") append(m_provider.attribute("ID").value());
        return realms;
    }

    void store(pugi::xml_node node, const Method& method) {
        const auto realms = realmsOf(method);
        const std::string name = method.type == kTypeUser ? "EAP-TTLS" : "EAP-TLS";
        if (realms.empty()) return refuse(node, name, "it names no realm");
        bool isNew = false;
        for (const std::string& realm : realms)
            isNew = add(method, realm) || isNew;
        if (!isNew) refuse(node, "a further way of " + name, "there is one for the same realm");
    }

    /// False: there is one already.
    bool add(const Method& method, const std::string& realm) {
        const bool isThere = std::any_of(m_found.begin(), m_found.end(), [&](const FiledCredential& other) {
            return other.credential.type == method.type && other.credential.realm == realm;
        });
        if (isThere) return false;
        FiledCredential filed;
        Credential& credential = filed.credential;
        credential.type = method.type;
        credential.method = method.type == kTypeUser ? kMethodTtls : kMethodTls;
        credential.access = kAllUsers;
        credential.autoConnect = true;
        credential.realm = realm;
        credential.username = method.username;
        credential.password = method.password;
        credential.caCert = method.caCert;
        filed.provider = m_index;
        if (method.wantsSuffix && !method.suffix.empty()) filed.userSuffix = "@" + method.suffix;
        m_found.push_back(std::move(filed));
        return true;
    }

    // No two credentials have the same name.
    void nameAll() {
        for (FiledCredential& filed : m_found) {
            Credential& credential = filed.credential;
            credential.name = m_name.empty() ? credential.realm : m_name;
            if (m_found.size() > 1)
                credential.name += " (" + credential.realm + ", " + methodName(credential) + ")";
        }
    }

    pugi::xml_node m_provider;
    std::size_t m_index;
    std::string m_name;
    MetadataNotes m_notes;
    std::vector<FiledCredential> m_found;
};

}  // namespace

CredentialFile readEapMetadata(const std::string& text) {
    pugi::xml_document document;
    loadForeignXml(text, document);
    const pugi::xml_node root = document.document_element();
    if (localName(root) != "EAPIdentityProviderList")
        throw ClientError("the file is no EAP metadata: its root is " + inQuotes(root.name()));
    CredentialFile file;
    std::size_t index = 0;
    for (const pugi::xml_node provider : childrenOf(root, "EAPIdentityProvider"))
        ProviderReader(provider, index++).readInto(file);
    return file;
}

}  // namespace vexa::client
