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

template <class Entry>
bool isEntryOf(const Entry& entry, std::int32_t credId, std::string_view ssid) {
    return entry.credId == credId && entry.ssid == textOf(ssid);
}

// Null if the pair has no entry.
template <class Entries>
auto* entryOf(Entries& entries, std::int32_t credId, std::string_view ssid) {
    const auto found = std::find_if(entries.begin(), entries.end(),
                                    [&](const auto& entry) { return isEntryOf(entry, credId, ssid); });
    return found == entries.end() ? nullptr : &*found;
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

std::uint32_t NetworkRetryHelper::getNumRetries(std::int32_t credId, std::string_view ssid) const {
    const auto* const entry = entryOf(m_cred2ssid, credId, ssid);
    return entry == nullptr ? 0 : entry->numRetries;
}

void NetworkRetryHelper::setNumRetries(std::int32_t credId, std::string_view ssid, std::uint32_t count) {
    if (!isPair(credId, ssid)) return;
    if (auto* const entry = entryOf(m_cred2ssid, credId, ssid)) {
        entry->numRetries = count;
        return;
    }
    const std::string text(textOf(ssid));
    Log(3, "Not found cred2ssid entry: credId=%d, ssid=%s, adding a new entry with numRetries=0", credId,
        text.c_str());
    m_cred2ssid.push_back({credId, text, count});
}

void NetworkRetryHelper::increaseNumRetries(std::int32_t credId, std::string_view ssid) {
    const std::string text(textOf(ssid));
    Log(3, "Increase retry numbers for cred id=%d, ssid=%s", credId, text.c_str());
    if (!isPair(credId, ssid)) return;
    if (auto* const entry = entryOf(m_cred2ssid, credId, ssid)) {
        Log(3, "\tIncrease cred2ssid num retries: credId=%d, ssid=%s, numRetries=%d\n", credId, text.c_str(),
            static_cast<int>(entry->numRetries));
        ++entry->numRetries;
        return;
    }
    Log(3, "\tNot found entry for cred id=%d and ssid=%s, set retry number to 1.", credId, text.c_str());
    setNumRetries(credId, ssid, 1);
}

void NetworkRetryHelper::removeNumRetryEntries(std::int32_t credId, std::string_view ssid) {
    if (!isPair(credId, ssid)) return;
    std::erase_if(m_cred2ssid, [&](const Cred2SsidEntry& entry) { return isEntryOf(entry, credId, ssid); });
}

void NetworkRetryHelper::removeAllCredNumRetryEntries(std::int32_t credId) {
    Log(3, "removeAllCredNumRetryEntries for CredId=%d", credId);
    std::erase_if(m_cred2ssid, [credId](const Cred2SsidEntry& entry) { return entry.credId == credId; });
}

void NetworkRetryHelper::resetNumRetries(std::int32_t credId) {
    for (Cred2SsidEntry& entry : m_cred2ssid)
        if (entry.credId == credId) entry.numRetries = 0;
}

void NetworkRetryHelper::resetAllNumRetries() {
    Log(3, "Enter resetAllNumRetries.");
    for (Cred2SsidEntry& entry : m_cred2ssid)
        entry.numRetries = 0;
}

// Names are compared as everywhere: it is enough that one begins with what is looked for. In order, all of
// those follow the place where it would stand itself.
void NetworkRetryHelper::eraseUnavailableNetworks(const Hs20NetworkList& networks) {
    std::set<std::string_view> names;
    for (const Hs20Network* network : networks.copyPointers())
        names.emplace(network->m_ssid.data(), network->m_ssid.size());
    std::erase_if(m_cred2ssid, [&](const Cred2SsidEntry& entry) {
        const auto next = names.lower_bound(entry.ssid);
        if (!entry.ssid.empty() && next != names.end() && next->starts_with(entry.ssid)) return false;
        Log(3, "BSS with ssid=%s is no longer available, erase the corresponding retry history",
            entry.ssid.c_str());
        return true;
    });
}

}  // namespace vexa
