#include "connection/NetworkRetryHelper.h"

#include <algorithm>
#include <set>

#include "base/DiagnosticLog.h"
#include "config/CredentialTable.h"
#include "hotspot/Hs20NetworkList.h"

namespace vexa {

namespace {

constexpr std::uint32_t kTlsLimit = 1;
constexpr std::uint32_t kTtlsLimit = 2;

std::uint32_t limitOf(const Credential& credential) {
    const bool isTls = credential.m_eapMethod == kEapMethodTls || credential.m_type == CRED_TYPE_EAP_TLS;
    return isTls ? kTlsLimit : kTtlsLimit;
}

// Kept as text, up to its first NUL.
std::string_view textOf(std::string_view ssid) {
    return ssid.substr(0, ssid.find('\0'));
}

bool isPair(std::int32_t credId, std::string_view ssid) {
    return credId >= 1 && !ssid.empty();
}

}  // namespace

bool NetworkRetryHelper::isRetryAllowed(const CredentialTable& credentials, std::int32_t credId,
                                        std::string_view ssid) const {
    const Credential* const credential = credId < 1 ? nullptr : credentials.findCredentialById(credId);
    if (credential == nullptr) {
        Log(6, "ERROR: Cannot get credential with id=%d", credId);
        return false;
    }
    return getNumRetries(credId, ssid) < limitOf(*credential);
}

// Null if the pair has none.
NetworkRetryHelper::Entry* NetworkRetryHelper::entryOf(std::int32_t credId, std::string_view ssid) {
    const auto entries = m_cred2ssid.find(credId);
    if (entries == m_cred2ssid.end()) return nullptr;
    const auto entry = entries->second.find(textOf(ssid));
    return entry == entries->second.end() ? nullptr : &entry->second;
}

std::uint32_t NetworkRetryHelper::getNumRetries(std::int32_t credId, std::string_view ssid) const {
    const auto entries = m_cred2ssid.find(credId);
    if (entries == m_cred2ssid.end()) return 0;
    const auto entry = entries->second.find(textOf(ssid));
    return entry == entries->second.end() ? 0 : entry->second.numRetries;
}

void NetworkRetryHelper::setNumRetries(std::int32_t credId, std::string_view ssid, std::uint32_t count) {
    if (!isPair(credId, ssid)) return;
    if (Entry* const entry = entryOf(credId, ssid)) {
        entry->numRetries = count;
        return;
    }
    std::string text(textOf(ssid));
    Log(3, "Not found cred2ssid entry: credId=%d, ssid=%s, adding a new entry with numRetries=0", credId,
        text.c_str());
    m_cred2ssid[credId].emplace(std::move(text), Entry{count, ++m_lastNumber});
}

void NetworkRetryHelper::increaseNumRetries(std::int32_t credId, std::string_view ssid) {
    const std::string text(textOf(ssid));
    Log(3, "Increase retry numbers for cred id=%d, ssid=%s", credId, text.c_str());
    if (!isPair(credId, ssid)) return;
    if (Entry* const entry = entryOf(credId, ssid)) {
        Log(3, "\tIncrease cred2ssid num retries: credId=%d, ssid=%s, numRetries=%d\n", credId, text.c_str(),
            static_cast<int>(entry->numRetries));
        ++entry->numRetries;
        return;
    }
    Log(3, "\tNot found entry for cred id=%d and ssid=%s, set retry number to 1.", credId, text.c_str());
    setNumRetries(credId, ssid, 1);
}

void NetworkRetryHelper::removeNumRetryEntries(std::int32_t credId, std::string_view ssid) {
    const auto entries = m_cred2ssid.find(credId);
    if (!isPair(credId, ssid) || entries == m_cred2ssid.end()) return;
    const auto entry = entries->second.find(textOf(ssid));
    if (entry != entries->second.end()) entries->second.erase(entry);
}

void NetworkRetryHelper::removeAllCredNumRetryEntries(std::int32_t credId) {
    Log(3, "removeAllCredNumRetryEntries for CredId=%d", credId);
    m_cred2ssid.erase(credId);
}

void NetworkRetryHelper::resetNumRetries(std::int32_t credId) {
    const auto entries = m_cred2ssid.find(credId);
    if (entries == m_cred2ssid.end()) return;
    for (auto& [ssid, entry] : entries->second)
        entry.numRetries = 0;
}

void NetworkRetryHelper::resetAllNumRetries() {
    Log(3, "Enter resetAllNumRetries.");
    for (auto& [credId, entries] : m_cred2ssid)
        for (auto& [ssid, entry] : entries)
            entry.numRetries = 0;
}

// Names are compared as everywhere: it is enough that one begins with what is looked for. In order, all of
// those follow the place where it would stand itself.
void NetworkRetryHelper::eraseUnavailableNetworks(const Hs20NetworkList& networks) {
    std::set<std::string_view> names;
    for (const Hs20Network* network : networks.copyPointers())
        names.emplace(network->m_ssid.data(), network->m_ssid.size());
    std::map<std::uint64_t, std::string> gone;
    for (auto& [credId, entries] : m_cred2ssid)
        std::erase_if(entries, [&](const auto& item) {
            const auto& [ssid, entry] = item;
            const auto next = names.lower_bound(ssid);
            if (!ssid.empty() && next != names.end() && next->starts_with(ssid)) return false;
            gone.emplace(entry.number, ssid);
            return true;
        });
    for (const auto& [number, ssid] : gone)
        Log(3, "BSS with ssid=%s is no longer available, erase the corresponding retry history",
            ssid.c_str());
}

}  // namespace vexa
