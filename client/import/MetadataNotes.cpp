#include "client/import/MetadataNotes.h"

#include <algorithm>
#include <array>
#include <string_view>

#include "client/import/ForeignXml.h"
#include "client/terminal/Text.h"
#include "text/OneOf.h"

namespace vexa::client {

namespace {

constexpr int kWidest = 60;

/// Elements that only hold others: these are told one by one.
constexpr std::array kContainers{"AuthenticationMethods",
                                 "AuthenticationMethod",
                                 "EAPMethod",
                                 "NonEAPAuthMethod",
                                 "ServerSideCredential",
                                 "ClientSideCredential",
                                 "CredentialApplicability",
                                 "IEEE80211",
                                 "IEEE8023",
                                 "InnerAuthenticationMethod",
                                 "ProviderInfo",
                                 "Helpdesk"};

/// Why a credential does not hold it. What may be secret, or long, is not shown.
struct Known {
    std::string_view name;
    const char* reason;
    bool isShown;
};
constexpr std::array kKnown{
    Known{"SSID", "a network is told by its realms, not by its name", true},
    Known{"ConsortiumOID", "a network is told by its realms", true},
    Known{"MinRSNProto", "networks are joined with WPA2 and AES", true},
    Known{"ServerID", "a credential names no server", true},
    Known{"CA", "a credential for EAP-TLS names one authority, one for EAP-TTLS none", false},
    Known{"OuterIdentity", "a credential chooses none", true},
    Known{"InnerIdentityPrefix", "nothing goes before a user name", true},
    Known{"UserName", "EAP-TLS has none", true},
    Known{"Password", "EAP-TLS has none", false},
    Known{"ClientCertificate", "it belongs into the system's store; --client-cert names it", false},
    Known{"Passphrase", "it is needed where the certificate is put into the system's store", false},
    Known{"ValidUntil", "a credential has no end", true},
};
constexpr Known kOther{"", "a credential has no place for it", false};

const Known& knownAs(const std::string& name) {
    const auto found =
        std::find_if(kKnown.begin(), kKnown.end(), [&](const Known& known) { return known.name == name; });
    return found == kKnown.end() ? kOther : *found;
}

std::string shortened(const std::string& text) {
    return '"' + cutToColumns(printable(text), kWidest, "...") + '"';
}

}  // namespace

void MetadataNotes::tell(const std::string& what, const std::string& reason) {
    const std::string line = inQuotes(m_provider) + ": " + what + " is not kept: " + reason;
    if (m_told.insert(line).second) m_lines.push_back(line);
}

void MetadataNotes::tellRest(pugi::xml_node parent) {
    for (const pugi::xml_node node : parent.children()) {
        if (node.type() == pugi::node_element && !m_taken.contains(node)) tellElement(node);
    }
}

void MetadataNotes::tellElement(pugi::xml_node node) {
    const std::string name = localName(node);
    if (isOneOf(kContainers, name)) return tellRest(node);
    if (!node.first_child()) return;
    const Known& known = knownAs(name);
    tell(printable(name) + (known.isShown ? " " + shortened(textOf(node)) : ""), known.reason);
}

}  // namespace vexa::client
