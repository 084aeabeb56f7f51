#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "base/NetworkListLock.h"
#include "config/Credential.h"
#include "config/ResultCodes.h"
#include "hotspot/Hs20Network.h"

namespace vexa {

/// One generated WLAN profile. No profile is ever stored by the operating system: the text travels in the
/// request.
struct NetworkProfile {
    std::int32_t m_id = 0;
    std::int32_t m_priority = CRED_PRIORITY_LOWEST;
    std::wstring m_name;          // the SSID's bytes, widened; the key of all lookups
    bool m_bMachineAuth = false;  // EAP-TLS only
    std::int32_t m_eapMethod = 0;
    std::wstring m_profileXml;
    std::int32_t m_credId = -1;  // the credential that it was built from
};

/// The generated profiles, one for each SSID, the newest first.
class NetworkProfileMgr {
public:
    /// kSuccess, or kNotFound with `profile` null.
    ResultCode findProfileByName(const std::wstring& name, NetworkProfile*& profile) const
        REQUIRES(g_hs20Lock);

    /// Builds a profile and adds it. `domain` is what an EAP-TTLS profile carries as such. kFailure, with
    /// `profile` null, for a credential or a network that gives none. The list keeps the profile.
    ResultCode addProfileFromCredential(const Credential& credential, const Hs20Network& network,
                                        bool machineAuth, const std::wstring& domain,
                                        NetworkProfile*& profile) REQUIRES(g_hs20Lock);

    /// False for an id below 1; one that isn't there changes nothing.
    bool deleteProfile(std::int32_t id) REQUIRES(g_hs20Lock);

    /// kSuccess, or kInvalidArgument for an id below 1.
    ResultCode deleteProfilesOfCredential(std::int32_t credId) REQUIRES(g_hs20Lock);

    void clear() REQUIRES(g_hs20Lock) { m_profiles.clear(); }

private:
    ResultCode addEapTlsProfile(const Credential& credential, const std::wstring& ssid, bool machineAuth,
                                NetworkProfile*& profile) REQUIRES(g_hs20Lock);
    ResultCode addEapTtlsProfile(const Credential& credential, const std::wstring& ssid,
                                 const std::wstring& domain, NetworkProfile*& profile) REQUIRES(g_hs20Lock);
    NetworkProfile* add(NetworkProfile profile) REQUIRES(g_hs20Lock);
    void sortByPriority() REQUIRES(g_hs20Lock);

    std::vector<std::unique_ptr<NetworkProfile>> m_profiles GUARDED_BY(g_hs20Lock);
};

}  // namespace vexa
