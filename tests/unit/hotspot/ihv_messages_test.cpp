#include "hotspot/IhvMessages.h"

#include <gtest/gtest.h>

#include "hotspot/Hs20Network.h"
#include "unit/hotspot/WireBytes.h"

namespace vexa::test {
namespace {

TEST(IhvMessages, AnSsidEndsAtItsFirstNulAndThatOfANetworkAt32Bytes) {
    const Hs20BssRecord full = parseBssRecord(bssRecord("a0b0c0d0e0f0", std::string(34, 'y')));
    EXPECT_EQ(toText(full.macAddress), "a0:b0:c0:d0:e0:f0");
    EXPECT_EQ(full.ssid, std::string(34, 'y'));
    EXPECT_EQ(Hs20Network(full).ssid(), std::string(32, 'y'));
    EXPECT_EQ(parseBssRecord(bssRecord("010203040506", std::string("ab\0cd", 5))).ssid, "ab");
}

TEST(IhvMessages, FieldsBehindTheEndOfAShortRecordAreZero) {
    const Block whole = bssRecord("010203040506", "Airport", 1, 0x80000002, 3);
    for (std::size_t size = 0; size <= whole.size(); ++size) {
        const Hs20BssRecord record = parseBssRecord(Bytes(whole).first(size));
        EXPECT_EQ(record.isHs20, size > 40 ? 1U : 0U) << size;
        EXPECT_EQ(record.networkType & 0xFF, size > 44 ? 2U : 0U) << size;
        EXPECT_EQ(record.networkType >> 31, size > 47 ? 1U : 0U) << size;
        EXPECT_EQ(record.internetAccess, size > 48 ? 3U : 0U) << size;
    }
}

}  // namespace
}  // namespace vexa::test
