#include "config/Credential.h"

#include <tuple>
#include <utility>

namespace vexa {

Credential::Credential(std::int32_t id, std::wstring creator, std::int32_t type, std::int32_t accessType)
    : m_id(id), m_creator(std::move(creator)), m_type(type), m_accessType(accessType) {}

bool holdTheSame(const Credential& a, const Credential& b) {
    const auto all = [](const Credential& one) {
        return std::tie(one.m_id, one.m_type, one.m_accessType, one.m_eapMethod, one.m_bAutoConnect,
                        one.m_realm, one.m_credName, one.m_username, one.m_password, one.m_caCert,
                        one.m_clientCert, one.m_creator, one.m_roamingConsortium, one.m_homeSpFqdn);
    };
    return (a.m_edition != 0 && a.m_edition == b.m_edition) || all(a) == all(b);
}

}  // namespace vexa
