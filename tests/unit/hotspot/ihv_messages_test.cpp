#include "hotspot/IhvMessages.h"

#include <gtest/gtest.h>

#include "hotspot/Hs20Network.h"
#include "unit/hotspot/WireBytes.h"

namespace vexa::test {
namespace {

TEST(IhvRequests, PlainOnesAreAHeaderAndFourZeroBytes) {
    struct Case {
        IhvRequest subtype;
        const char* hex;
    };
    const Case cases[] = {
        {IhvRequest::QueryAnqp, "005ec403 00000000 03000000 00000000 00000000"},
        {IhvRequest::GetBssList, "005ec403 00000000 05000000 00000000 00000000"},
    };
    for (const Case& c : cases)
        EXPECT_EQ(hexOf(ihvRequest(c.subtype)), hexOf(bytesOfHex(c.hex)));
}

TEST(IhvRequests, ThatForOneBssHoldsItsRecordMarkedAsHotspotWhateverItIs) {
    Hs20BssRecord record{{1, 2, 3, 4, 5, 6}, "Airport", 7, 0x11223344, 0x55667788};
    const Block request = ihvRequest(IhvRequest::GetAnqpInfo, Hs20Network(record).record());
    EXPECT_EQ(hexOf(request), hexOf(bytesOfHex("005ec403 00000000 08000000 34000000") +
                                    bssRecord("010203040506", "Airport", 1, 0x11223344, 0x55667788)));
    EXPECT_EQ(request.size(), 68U);
}

TEST(IhvRequests, AnSsidOf32BytesFillsTheFieldButForItsLastTwoBytes) {
    const std::string ssid(32, 'x');
    const Block request = ihvRequest(IhvRequest::GetAnqpInfo, {{}, ssid, 1, 0, 0});
    EXPECT_EQ(hexOf(Bytes(request).subspan(22, 34)), hexOf(bytesOfText(ssid)) + "0000");
}

TEST(BssRecords, AreReadFieldByField) {
    const Block block = bssRecord("a0b0c0d0e0f0", "Caf\xc3\xa9", 1, 0x80000001, 0xFFFFFFFF);
    const auto records = parseBssRecords(block);
    ASSERT_EQ(records.size(), 1U);
    EXPECT_EQ(records[0].macAddress, (MacAddress{0xa0, 0xb0, 0xc0, 0xd0, 0xe0, 0xf0}));
    EXPECT_EQ(records[0].ssid, "Caf\xc3\xa9");
    EXPECT_EQ(records[0].isHs20, 1U);
    EXPECT_EQ(records[0].networkType, 0x80000001U);
    EXPECT_EQ(records[0].internetAccess, 0xFFFFFFFFU);
}

TEST(BssRecords, AreAsManyAsFitWhole) {
    for (std::size_t size = 0; size <= 52 * 4; ++size)
        EXPECT_EQ(parseBssRecords(Block(size)).size(), size / 52) << size;
    EXPECT_EQ(parseBssRecords(Block(10240)).size(), 196U);
}

TEST(BssRecords, AnSsidEndsAtItsFirstNulAndThatOfANetworkAt32Bytes) {
    const Hs20BssRecord full = parseBssRecord(bssRecord("010203040506", std::string(34, 'y')));
    EXPECT_EQ(full.ssid, std::string(34, 'y'));
    EXPECT_EQ(Hs20Network(full).ssid(), std::string(32, 'y'));
    EXPECT_EQ(parseBssRecord(bssRecord("010203040506", std::string("ab\0cd", 5))).ssid, "ab");
    EXPECT_EQ(parseBssRecord(bssRecord("010203040506", "")).ssid, "");
}

TEST(BssRecords, FieldsBehindTheEndOfAShortBlockAreZero) {
    const Block whole = bssRecord("010203040506", "Airport", 1, 2, 3);
    for (std::size_t size = 0; size < whole.size(); ++size) {
        const Block block(whole.begin(), whole.begin() + static_cast<std::ptrdiff_t>(size));
        const Hs20BssRecord record = parseBssRecord(block);
        EXPECT_EQ(record.isHs20, size > 40 ? 1U : 0U) << size;
        EXPECT_EQ(record.networkType, size > 44 ? 2U : 0U) << size;
        EXPECT_EQ(record.internetAccess, size > 48 ? 3U : 0U) << size;
    }
}

TEST(IhvNotifications, APayloadIsAsLongAsItClaimsButNoLongerThanItsBlock) {
    struct Case {
        const char* claimed;
        std::size_t behind;
        std::size_t payload;
    };
    const Case cases[] = {
        {"00000000", 8, 0}, {"04000000", 8, 4},   {"08000000", 8, 8}, {"09000000", 8, 8},
        {"ffffffff", 8, 8}, {"34000000", 51, 51}, {"00000080", 0, 0},
    };
    for (const Case& c : cases) {
        const Block block =
            bytesOfHex("005ec403 ffffffff 02000000") + bytesOfHex(c.claimed) + Block(c.behind);
        const IhvMessage message = parseIhvMessage(block);
        EXPECT_EQ(message.subtype, IhvNotification::NetworkListChanged);
        EXPECT_EQ(message.payload.size(), c.payload) << c.claimed;
        EXPECT_EQ(message.block.size(), c.behind) << c.claimed;
    }
}

TEST(IhvNotifications, ANumberThatIsNotThereReadsAsZero) {
    const Block payload = bytesOfHex("01020304 05060708");
    EXPECT_EQ(numberAt(payload, 0), 0x04030201U);
    EXPECT_EQ(numberAt(payload, 3), 0x07060504U);
    EXPECT_EQ(numberAt(payload, 4), 0x08070605U);
    EXPECT_EQ(numberAt(payload, 5), 0U);
    EXPECT_EQ(numberAt({}, 0), 0U);
}

TEST(IhvText, AMacAddressIsWrittenInLowerCaseWithColons) {
    EXPECT_EQ(toText({0xAB, 0x00, 0x0C, 0x12, 0xFF, 0x07}), "ab:00:0c:12:ff:07");
}

}  // namespace
}  // namespace vexa::test
