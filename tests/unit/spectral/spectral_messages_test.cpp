#include "spectral/SpectralMessages.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <initializer_list>

namespace vexa {
namespace {

std::vector<std::byte> bytes(std::initializer_list<int> values, std::size_t size = 0) {
    std::vector<std::byte> result;
    for (const int value : values)
        result.push_back(static_cast<std::byte>(value));
    result.resize(std::max(result.size(), size));
    return result;
}

// A notification of samples that announces `announced` records and holds `held` bytes behind its count.
std::vector<std::byte> samples(int announced, std::size_t held, int magicLow = 0x32) {
    auto message = bytes({0x00, 0x5E, 0xC4, 0x06, 0, 0, 0, 0, 1, 0, 0, 0, magicLow, 0x5C, 0, 0,
                          announced & 0xFF, announced >> 8});
    for (std::size_t i = 0; i < held; ++i)
        message.push_back(static_cast<std::byte>(i % SampleRecord::kSize));
    return message;
}

TEST(SpectralMessages, RequestsByByte) {
    const auto start = scanControlRequest(true);
    EXPECT_EQ(
        std::vector(start.begin(), start.end()),
        bytes({1, 0, 0, 0, 0x0B, 0, 0xA3, 0xFF, 0, 0, 0, 0, 8, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 1}, 32));
    EXPECT_EQ(scanControlRequest(false)[24], std::byte{0});
    EXPECT_EQ(channelListRequest(),
              bytes({0, 0, 0, 0, 0x04, 0, 0x50, 0xFF, 0,    0,    0,    0,    0x14, 0x08, 0,    0,    0, 0,
                     0, 0, 0, 0, 0,    0, 0x80, 0x01, 0x10, 0x00, 0x08, 0x08, 0,    0,    0x08, 0x08, 0, 0},
                    2092));
}

TEST(SpectralMessages, AChannelListNeverReachesBehindItsAnswer) {
    auto answer = bytes({}, 2092);
    for (std::size_t i = 0; i < 256; ++i)
        answer[46 + 8 * i] = static_cast<std::byte>(i);
    struct Case {
        std::uint32_t count;
        std::size_t size;
        std::size_t channels;
    };
    for (const Case& c : {Case{3, 2092, 3},
                          {0, 2092, 0},
                          {256, 2092, 256},
                          {257, 2092, 256},
                          {0xFFFFFFFF, 2092, 256},
                          {3, 44, 0},
                          {3, 43, 0},
                          {3, 0, 0},
                          {3, 52, 1},
                          {3, 59, 1},
                          {3, 60, 2}}) {
        writeLittleEndian(answer, 40, c.count);
        const auto channels = parseChannelList(Bytes(answer).first(c.size));
        ASSERT_EQ(channels.size(), c.channels) << c.count << " in " << c.size;
        for (std::size_t i = 0; i < channels.size(); ++i)
            EXPECT_EQ(channels[i], static_cast<int>(i));
    }
}

TEST(SpectralMessages, RecordsThatDoNotFitAreDropped) {
    struct Case {
        int announced;
        std::size_t held;
        std::size_t records;
    };
    for (const Case& c :
         {Case{0, 472, 0}, {1, 236, 1}, {2, 236, 1}, {65535, 500, 2}, {1, 235, 0}, {1, 0, 0}, {1, 472, 1}})
        EXPECT_EQ(parseSamples(samples(c.announced, c.held)).size(), c.records)
            << c.announced << " in " << c.held;
    EXPECT_TRUE(parseSamples(samples(1, 236, 0x33)).empty());
    EXPECT_TRUE(parseSamples(Bytes(samples(1, 236)).first(17)).empty());
}

TEST(SpectralMessages, FieldsOfARecordStandAtTheirOffsetsAlignedOrNot) {
    auto message = samples(2, 472);
    message[18 + 236 + 7] = std::byte{0xFE};
    message[18 + 236 + 8] = std::byte{0xFF};
    const SampleRecord record = parseSamples(message)[1];
    EXPECT_EQ(record.frequency(), 0x0100);
    EXPECT_EQ(record.congestion(), 0x0302);
    EXPECT_EQ(record.power(), -2);
    EXPECT_EQ(record.bins().front(), std::byte{56});
    EXPECT_EQ(record.bins().back(), std::byte{111});
}

}  // namespace
}  // namespace vexa
