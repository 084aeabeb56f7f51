#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "text/LittleEndian.h"

namespace vexa {

/// One EAP method of a realm, with what its authentication parameters tell; only `method` is used further.
struct NaiRealmEap {
    std::uint8_t method = 0;
    std::uint8_t innerMethod = 0;
    std::uint32_t innerNonEap = 0;
    std::uint8_t credType = 0;
    std::uint8_t tunneledCredType = 0;
};

/// One NAI Realm Data entry of an ANQP NAI Realm list.
struct NaiRealm {
    std::uint8_t encoding = 0;
    std::string_view realm;  ///< One or more names, separated by ";".
    std::vector<NaiRealmEap> eap;
};

/// One realm name with one EAP method that this client has credentials for.
struct RealmInfo {
    std::uint32_t m_eapType;  ///< 1 EAP-TLS, 2 EAP-TTLS.
    std::string m_realm;

    friend bool operator==(const RealmInfo&, const RealmInfo&) = default;
    friend auto operator<=>(const RealmInfo&, const RealmInfo&) =
        default;  // NOLINT(modernize-use-nullptr): it takes this for a 0
};

/// Takes an ANQP NAI Realm list apart (IEEE 802.11u). Nothing if it is empty, or bad at any place: one bad
/// entry loses the whole list. No read goes beyond the bytes, whatever they claim. What it gives points into
/// them.
std::optional<std::vector<NaiRealm>> parseNaiRealmList(Bytes list);

/// One entry for each name of each realm and each of its methods, as many as a network keeps; methods other
/// than EAP-TLS and EAP-TTLS are left out, with a line in the log.
std::vector<RealmInfo> flattenRealms(const std::vector<NaiRealm>& realms);

}  // namespace vexa
