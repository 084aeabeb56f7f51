// Any bytes as an ANQP NAI Realm list: the parser and a second reader find the same, or both refuse.

#include <vector>

#include "fuzz/FuzzMachine.h"
#include "hotspot/NaiRealmParser.h"
#include "unit/hotspot/RealmDissector.h"

namespace vexa::test {
namespace {

void compare(const Block& list) {
    const auto dissected = dissectRealms(list);
    const auto parsed = parseNaiRealmList(list);
    require(parsed.has_value() == dissected.has_value(), "both take the list or both refuse it");
    if (!parsed) return;
    std::vector<DissectedRealm> found;
    for (const RealmInfo& realm : flattenRealms(*parsed))
        found.emplace_back(realm.m_realm, realm.m_eapType == 1 ? 13U : 21U);
    require(found == *dissected, "both find the same realms and methods");
}

}  // namespace
}  // namespace vexa::test

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const auto* const bytes = reinterpret_cast<const std::byte*>(data);
    vexa::test::compare(vexa::test::Block(bytes, bytes + size));
    return 0;
}
