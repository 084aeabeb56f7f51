#include <gtest/gtest.h>

#include <random>

#include "hotspot/NaiRealmParser.h"
#include "unit/hotspot/RealmDissector.h"

namespace vexa::test {
namespace {

using Random = std::mt19937_64;

Block randomBytes(Random& random, std::size_t most) {
    Block bytes(random() % (most + 1));
    for (std::byte& byte : bytes)
        byte = static_cast<std::byte>(random() & 0xFF);
    return bytes;
}

template <class Make>
std::vector<Block> several(Random& random, std::size_t most, Make make) {
    std::vector<Block> blocks(random() % (most + 1));
    for (Block& block : blocks)
        block = make(random);
    return blocks;
}

Block randomParameter(Random& random) {
    static constexpr unsigned kIds[] = {2, 3, 5, 6, 1, 4, 221};
    return authParameter(kIds[random() % std::size(kIds)], randomBytes(random, 3));
}

Block randomMethod(Random& random) {
    static constexpr unsigned kMethods[] = {13, 21, 13, 21, 18, 23, 50, 0};
    Block method = eapMethod(kMethods[random() % std::size(kMethods)], several(random, 3, randomParameter));
    if (random() % 4 == 0) {  // padding that belongs to the method
        const Block padding = randomBytes(random, 3);
        method[0] = static_cast<std::byte>(std::to_integer<std::size_t>(method[0]) + padding.size());
        method = method + padding;
    }
    return method;
}

std::string randomNames(Random& random) {
    std::string names;
    for (std::uint64_t left = random() % 12; left > 0; --left)
        names += "ab.;;-\0c"[random() % 8];
    return names;
}

Block randomEntry(Random& random) {
    return realmData(randomNames(random), several(random, 4, randomMethod));
}

Block mutated(Block list, Random& random) {
    for (std::uint64_t left = random() % 4; left > 0 && !list.empty(); --left) {
        const auto place = list.begin() + static_cast<std::ptrdiff_t>(random() % list.size());
        switch (random() % 4) {
            case 0:
                *place = static_cast<std::byte>(random() & 0xFF);
                break;
            case 1:
                *place =
                    static_cast<std::byte>(std::to_integer<unsigned>(*place) + (random() % 2 == 0 ? 1 : 255));
                break;
            case 2:
                list.erase(place);
                break;
            default:
                list.insert(place, static_cast<std::byte>(random() & 0xFF));
        }
    }
    if (random() % 8 == 0) list.resize(random() % (list.size() + 1));
    list.shrink_to_fit();
    return list;
}

std::optional<std::vector<DissectedRealm>> parsed(const Block& list) {
    const auto realms = parseNaiRealmList(list);
    if (!realms) return std::nullopt;
    std::vector<DissectedRealm> found;
    for (const RealmInfo& realm : flattenRealms(*realms))
        found.emplace_back(realm.m_realm, realm.m_eapType == 1 ? 13U : 21U);
    return found;
}

TEST(NaiRealmsAtRandom, TheParserAndASecondReaderAgreeOnEveryList) {
    Random random(20240905);
    int accepted = 0;
    int refused = 0;
    for (int i = 0; i < 20000; ++i) {
        const Block list = mutated(realmList(several(random, 5, randomEntry)), random);
        const auto ours = parsed(list);
        ASSERT_EQ(ours, dissectRealms(list)) << hexOf(list);
        ++(ours ? accepted : refused);
    }
    EXPECT_GT(accepted, 2000);
    EXPECT_GT(refused, 2000);
}

TEST(NaiRealmsAtRandom, SoTheyDoOnBytesWithoutAnyForm) {
    Random random(7);
    for (int i = 0; i < 20000; ++i) {
        Block list = randomBytes(random, 40);
        if (list.size() >= 2) list[1] = std::byte{0};
        if (!list.empty()) list[0] &= std::byte{3};
        ASSERT_EQ(parsed(list), dissectRealms(list)) << hexOf(list);
    }
}

}  // namespace
}  // namespace vexa::test
