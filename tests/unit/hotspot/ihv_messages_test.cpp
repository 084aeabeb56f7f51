#include "hotspot/IhvMessages.h"

#include <gtest/gtest.h>

#include "hotspot/Hs20Network.h"
#include "unit/hotspot/WireBytes.h"

namespace vexa::test {
namespace {

TEST(IhvMessages, ARequestHoldsAHeaderAndTheRecordOfItsBssMarkedAsHotspotWhateverItIs) {
    EXPECT_EQ(hexOf(ihvRequest(IhvRequest::QueryAnqp)), "005ec4030000000003000000" + std::string(16, '0'));
    const Hs20BssRecord record{{1, 2, 3, 4, 5, 6}, "Airport", 7, 0x11223344, 0x55667788};
    EXPECT_EQ(hexOf(ihvRequest(IhvRequest::GetAnqpInfo, Hs20Network(record).record())),
              "005ec403000000000800000034000000" +
                  hexOf(bssRecord("010203040506", "Airport", 1, 0x11223344, 0x55667788)));
    const Block longest = ihvRequest(IhvRequest::GetAnqpInfo, {{}, std::string(32, 'x'), 1, 0, 0});
    EXPECT_EQ(hexOf(Bytes(longest).subspan(22, 34)), hexOf(bytesOfText(std::string(32, 'x'))) + "0000");
}

TEST(IhvMessages, AsManyRecordsAreReadAsFitWhole) {
    for (std::size_t size = 0; size <= 52 * 4; ++size)
        EXPECT_EQ(parseBssRecords(Block(size)).size(), size / 52) << size;
    EXPECT_EQ(parseBssRecords(Block(10240)).size(), 196U);
}

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
