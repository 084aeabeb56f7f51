#include "hotspot/CredentialMatching.h"

#include <algorithm>
#include <optional>
#include <utility>

#include "base/DiagnosticLog.h"
#include "contract/Realm.h"
#include "text/TextConversion.h"

namespace vexa {

namespace {

constexpr std::byte kRoamingConsortiumElement{111};

// A text that can't be converted counts as empty; one that is too long matches nothing.
std::optional<std::string> narrowForMatch(const std::wstring& text) {
    const NarrowText narrow = narrowByLocale(text);
    if (!narrow.isComplete) return std::string();
    return narrow.text.size() > contract::kMostMatchedBytes ? std::nullopt : std::optional(narrow.text);
}

std::string_view textOf(Bytes bytes) {
    return {reinterpret_cast<const char*>(bytes.data()), bytes.size()};
}

// The names of a list of duples, each a byte of length and that many bytes, up to the first that is cut
// short.
template <class Visit>
bool anyDuple(Bytes list, std::size_t leastLeft, Visit visit) {
    while (list.size() >= leastLeft) {
        const auto length = std::to_integer<std::size_t>(list[0]);
        if (length > list.size() - 1) return false;
        if (visit(list.subspan(1, length))) return true;
        list = list.subspan(1 + length);
    }
    return false;
}

Bytes findElement(Bytes elements, std::byte id) {
    while (elements.size() >= 2) {
        const std::size_t size = 2 + std::to_integer<std::size_t>(elements[1]);
        if (size > elements.size()) break;
        if (elements[0] == id) return elements.first(size);
        elements = elements.subspan(size);
    }
    return {};
}

// A pair of user name and password is needed for EAP-TTLS.
bool isComplete(const Credential& credential) {
    if (credential.m_eapMethod == kEapMethodTtls)
        return !credential.m_username.empty() && !credential.m_password.empty();
    return credential.m_eapMethod == kEapMethodTls;
}

bool fits(const Credential& credential, const RealmInfo& offer) {
    if (static_cast<std::uint32_t>(credential.m_eapMethod) == offer.m_eapType) return isComplete(credential);
    Log(3, "\t###Realm match, but EAP method doesn't match.###");
    return false;
}

}  // namespace

CredentialMatcher::CredentialMatcher(const CredentialTable& table) {
    for (const Credential* credential : table.copyCredentialPointers()) {
        auto realm = credential->m_realm.empty() ? std::nullopt : contract::realmBytes(credential->m_realm);
        if (realm) m_candidates.push_back({credential, std::move(*realm)});
    }
    std::stable_sort(m_candidates.begin(), m_candidates.end(), [](const Candidate& a, const Candidate& b) {
        return a.credential->m_priority < b.credential->m_priority;
    });
    for (std::size_t i = 0; i < m_candidates.size(); ++i)
        m_byRealm[m_candidates[i].realm].push_back(i);
}

// There are many realms in the air and few that a credential is for.
std::vector<const Credential*> CredentialMatcher::findCredentialsForNetwork(
    const Hs20Network& network) const {
    std::vector<bool> isFitting(m_candidates.size());
    bool isAnyFitting = false;
    for (const RealmInfo& realm : network.m_realms) {
        const auto candidates = m_byRealm.find(realm.m_realm);
        if (candidates == m_byRealm.end()) continue;
        for (const std::size_t candidate : candidates->second)
            if (fits(*m_candidates[candidate].credential, realm)) isAnyFitting = isFitting[candidate] = true;
    }
    std::vector<const Credential*> found;
    for (std::size_t candidate = 0; isAnyFitting && candidate < m_candidates.size(); ++candidate)
        if (isFitting[candidate]) found.push_back(m_candidates[candidate].credential);
    return found;
}

bool isHomeSpNetwork(const CredentialTable& table, const ByteBuffer& domainNames) {
    if (domainNames.empty()) return false;
    for (const Credential* credential : table.copyCredentialPointers()) {
        if (credential->m_homeSpFqdn.empty()) continue;
        const auto name = narrowForMatch(credential->m_homeSpFqdn);
        Log(2, "Interworking: Search for match with home SP FQDN %s", name.value_or("").c_str());
        if (name && domainNameMatch(domainNames, *name)) return true;
    }
    return false;
}

bool domainNameMatch(const ByteBuffer& domainNames, std::string_view name) {
    return anyDuple(domainNames, 2, [name](Bytes duple) {
        LogHex(0, "Interworking: AP domain name", duple.data(), duple.size());
        LogBytes(2, "Interworking: AP domain name", duple.data(), static_cast<std::int64_t>(duple.size()),
                 false);
        return compareNoCase(textOf(duple), name) == 0;
    });
}

const Credential* findRoamingConsortiumCredential(const CredentialTable& table, const Hs20Network& network) {
    const Bytes element = findElement(network.m_ies, kRoamingConsortiumElement);
    if (element.empty() && network.m_anqpRoamingConsortium.empty()) return nullptr;
    const Credential* best = nullptr;
    for (const Credential* credential : table.copyCredentialPointers()) {
        if (credential->m_roamingConsortium.empty()) continue;
        const auto id = narrowForMatch(credential->m_roamingConsortium);
        if (!id) continue;
        const bool isHit =
            roamingConsortiumElementMatch(element, *id) ||
            anyDuple(network.m_anqpRoamingConsortium, 1, [&](Bytes duple) { return textOf(duple) == *id; });
        if (isHit && (best == nullptr || credential->m_priority < best->m_priority)) best = credential;
    }
    return best;
}

bool roamingConsortiumElementMatch(Bytes element, std::string_view id) {
    if (element.size() < 4) return false;
    const Bytes identifiers = element.subspan(4);
    const auto lengths = std::to_integer<std::size_t>(element[3]);
    const std::size_t first = lengths & 0x0F;
    const std::size_t second = lengths >> 4;
    if (first + second > identifiers.size()) return false;
    const Bytes rest = identifiers.subspan(first + second);
    return textOf(identifiers.first(first)) == id || textOf(identifiers.subspan(first, second)) == id ||
           (!rest.empty() && textOf(rest) == id);
}

}  // namespace vexa
