#include "connection/NetworkProfileMgr.h"

#include <algorithm>
#include <utility>

#include "base/DiagnosticLog.h"
#include "connection/ProfileTemplates.h"
#include "text/TextConversion.h"

namespace vexa {

namespace {

constexpr const wchar_t* kMachine = L"machine";
constexpr const wchar_t* kMachineOrUser = L"machineOrUser";
constexpr const wchar_t* kAnonymous = L"anonymous";

bool isPlaced(const NetworkProfile& profile) {
    return profile.m_priority != 0 && profile.m_priority != CRED_PRIORITY_LOWEST;
}

NetworkProfile build(const Credential& credential, const std::wstring& ssid, std::int32_t eapMethod,
                     const wchar_t* authMode, const std::wstring& eapText) {
    NetworkProfile profile;
    profile.m_name = ssid;
    profile.m_eapMethod = eapMethod;
    profile.m_profileXml = profileText({ssid, ssidToHexString(ssid), ssid, authMode, eapText});
    profile.m_credId = credential.m_id;
    return profile;
}

}  // namespace

ResultCode NetworkProfileMgr::findProfileByName(const std::wstring& name, NetworkProfile*& profile) const {
    const auto found = std::find_if(m_profiles.begin(), m_profiles.end(),
                                    [&](const auto& candidate) { return candidate->m_name == name; });
    profile = found == m_profiles.end() ? nullptr : found->get();
    return profile == nullptr ? kNotFound : kSuccess;
}

ResultCode NetworkProfileMgr::addProfileFromCredential(const Credential& credential,
                                                       const Hs20Network& network, bool machineAuth,
                                                       const std::wstring& domain, NetworkProfile*& profile) {
    profile = nullptr;
    if (credential.m_id <= 0) {
        Log(6, "ERROR: Invalid credential id=%d", credential.m_id);
        return kFailure;
    }
    if (network.m_ssidLength == 0) {
        Log(6, "ERROR: Invalid BSS.");
        return kFailure;
    }
    const std::wstring ssid = wideFromNarrow(network.ssid());
    ResultCode result = kFailure;
    if (credential.m_eapMethod == kEapMethodTtls)
        result = addEapTtlsProfile(credential, ssid, domain, profile);
    else if (credential.m_eapMethod == kEapMethodTls)
        result = addEapTlsProfile(credential, ssid, machineAuth, profile);
    else
        Log(6, "Unexpected EAP method.");
    if (result == kSuccess && profile != nullptr) return kSuccess;
    Log(6, "Add network profile from credential failed.");
    return kFailure;
}

ResultCode NetworkProfileMgr::addEapTlsProfile(const Credential& credential, const std::wstring& ssid,
                                               bool machineAuth, NetworkProfile*& profile) {
    Log(2, "Adding a new EAP-TLS network profile with auth mode=%s...",
        machineAuth ? "machine" : "machineOrUser");
    const std::wstring eapText =
        eapTlsText({L"true", L"true", L"", credential.m_caCert, L"false", L"true", L"false"});
    NetworkProfile built =
        build(credential, ssid, kEapMethodTls, machineAuth ? kMachine : kMachineOrUser, eapText);
    built.m_bMachineAuth = machineAuth;
    profile = add(std::move(built));
    return kSuccess;
}

ResultCode NetworkProfileMgr::addEapTtlsProfile(const Credential& credential, const std::wstring& ssid,
                                                const std::wstring& domain, NetworkProfile*& profile) {
    Log(2, "Adding a new EAP-TTLS network profile...");
    LogWide(3, L"\tUsername=%s, password=%s", credential.m_username.c_str(), credential.m_password.c_str());
    if (credential.m_username.empty()) return kInvalidArgument;
    const std::wstring eapText =
        eapTtlsText({credential.m_username, credential.m_password, domain, kAnonymous});
    profile = add(build(credential, ssid, kEapMethodTtls, kMachineOrUser, eapText));
    return kSuccess;
}

NetworkProfile* NetworkProfileMgr::add(NetworkProfile profile) {
    m_profiles.reserve(m_profiles.size() + 1);
    auto added = std::make_unique<NetworkProfile>(std::move(profile));
    std::int32_t highest = 0;
    for (const auto& existing : m_profiles) {
        highest = std::max(highest, existing->m_id);
        if (isPlaced(*existing)) ++existing->m_priority;
    }
    added->m_id = highest + 1;
    added->m_priority = CRED_PRIORITY_HIGHEST;
    NetworkProfile* const result = added.get();
    m_profiles.push_back(std::move(added));
    sortByPriority();
    return result;
}

bool NetworkProfileMgr::deleteProfile(std::int32_t id) {
    if (id < 1) return false;
    const auto found = std::find_if(m_profiles.begin(), m_profiles.end(),
                                    [id](const auto& profile) { return profile->m_id == id; });
    if (found == m_profiles.end()) return true;
    const std::int32_t freed = (*found)->m_priority;
    for (auto behind = m_profiles.erase(found); behind != m_profiles.end(); ++behind)
        if ((*behind)->m_priority > freed && (*behind)->m_priority != 0) --(*behind)->m_priority;
    sortByPriority();
    return true;
}

ResultCode NetworkProfileMgr::deleteProfilesOfCredential(std::int32_t credId) {
    if (credId < 1) {
        Log(6, "ERROR: Invalid credential id=%d", credId);
        return kInvalidArgument;
    }
    std::vector<std::int32_t> ids;
    for (const auto& profile : m_profiles) {
        if (profile->m_credId != credId) continue;
        ids.push_back(profile->m_id);
        LogWide(3, L"Cred id=%d deleted, removing profile name=%s", credId, profile->m_name.c_str());
    }
    for (const std::int32_t id : ids)
        if (!deleteProfile(id)) Log(6, "ERROR: Delete network profile failed.");
    return kSuccess;
}

void NetworkProfileMgr::sortByPriority() {
    std::stable_sort(m_profiles.begin(), m_profiles.end(),
                     [](const auto& a, const auto& b) { return a->m_priority < b->m_priority; });
}

}  // namespace vexa
