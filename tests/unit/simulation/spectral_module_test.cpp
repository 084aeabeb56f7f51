#include <gtest/gtest.h>

#include "Station.h"

namespace vexa::simulation {
namespace {

const std::string kCompleted = hex("005ec406 00000000 02000000 325c0000");
constexpr std::size_t kHeaderSize = 18;
constexpr std::size_t kRecordSize = 236;

/// The client's side of the module.
class Module : public Station {
public:
    using Station::Station;

    DWORD send(const Bytes& request, DWORD capacity = 0) {
        return control(wlan_ihv_control_type_driver, request, capacity);
    }

    DWORD scan(const std::string& flag) {
        return send(*bytesFromHex(hex("01000000 0b00a3ff 00000000 08000000") + zeros(8) + flag + "00000000"));
    }

    DWORD start() { return scan("01000000"); }
    DWORD stop() { return scan("00000000"); }

    Texts blocksOfScan() {
        EXPECT_EQ(start(), ERROR_SUCCESS);
        machine.advance(400);
        return blocks();
    }
};

Bytes channelListRequest() {
    Bytes request = *bytesFromHex(
        hex("00000000 040050ff 00000000 14080000 0000000000000000 80011000 08080000 08080000 00000000"));
    request.resize(2092);
    return request;
}

TEST(SpectralModule, TravelsInPartsOfSixteenRecordsInTheOrderOfTheChannels) {
    Module module(
        "{'spectrum': {'channels': [14, 13, 14, 6], 'recordsPerScan': 9, 'scanMs': 9000,"
        "'levels': {'13': {'congestion': 30, 'power': 60}, '14': {'congestion': 70, 'power': 96}}}}");
    module.act("{'do': 'levels', 'levels': {'13': {'congestion': 9}}}");
    module.act("{'do': 'set', 'scanMs': 400}");
    const Texts blocks = module.blocksOfScan();
    ASSERT_EQ(blocks.size(), 3U);
    EXPECT_EQ(blocks[0].size(), 2 * (kHeaderSize + 16 * kRecordSize));
    EXPECT_EQ(blocks[1].size(), 2 * (kHeaderSize + 2 * kRecordSize));
    EXPECT_EQ(blocks[0].substr(32, 22), hex("1000 b409 4600 000000 6000"));
    EXPECT_EQ(blocks[1].substr(32, 22), hex("0200 a809 0900 000000 3c00"));
    EXPECT_EQ(blocks[1].substr(36 + 2 * 56, 6), "646464");
    EXPECT_EQ(blocks[2], kCompleted);
}

TEST(SpectralModule, AScanRunsOnceUntilItIsStoppedOrTheAdapterGoes) {
    Module module("{'spectrum': {}}");
    module.start();
    module.machine.advance(300);
    EXPECT_EQ(module.start(), ERROR_SUCCESS) << "while it runs, a start changes nothing";
    module.machine.advance(100);
    EXPECT_EQ(module.blocks(), Texts{kCompleted});
    module.machine.advance(1000);
    EXPECT_EQ(module.blocks(), Texts{});

    module.start();
    module.machine.advance(300);
    EXPECT_EQ(module.stop(), ERROR_SUCCESS);
    EXPECT_EQ(module.start(), ERROR_SUCCESS);
    module.machine.advance(399);
    EXPECT_EQ(module.blocks(), Texts{});
    module.machine.advance(1);
    EXPECT_EQ(module.blocks(), Texts{kCompleted});

    module.start();
    module.act("{'do': 'pullAdapter'}");
    EXPECT_EQ(module.start(), ERROR_NOT_FOUND);
    module.act("{'do': 'insertAdapter'}");
    module.machine.advance(1000);
    EXPECT_EQ(module.blocks(), Texts{});
}

TEST(SpectralModule, SendsScansAsTheyAreGivenAndThenNothingButTheCompletion) {
    Module module("{'spectrum': {'scans': [[], [{'frequency': 1}]]}}");
    std::string sizes;
    for (int scan = 0; scan < 3; ++scan) {
        for (const std::string& block : module.blocksOfScan())
            sizes += std::to_string(block.size() / 2) + " ";
    }
    EXPECT_EQ(sizes, "16 254 16 16 ");
}

TEST(SpectralModule, OneSeedGivesOneStoryWithinTheSpread) {
    const auto story = [](const std::string& seed) {
        Module module("{'seed': " + seed +
                      ", 'spectrum': {'channels': [1], 'recordsPerScan': 400, 'levels': {"
                      "'1': {'congestion': 3, 'power': -20, 'spread': 5}}}}");
        std::string records;
        for (const std::string& block : module.blocksOfScan())
            records += block.size() > kRecordSize ? block.substr(2 * kHeaderSize) : "";
        return *bytesFromHex(records);
    };
    const Bytes records = story("3");
    EXPECT_EQ(story("3"), records);
    EXPECT_NE(story("4"), records);
    int lowest = 99;
    int highest = -99;
    for (std::size_t at = 0; at < records.size(); at += kRecordSize) {
        EXPECT_LE(records[at + 2], 8);
        const auto power = static_cast<std::int16_t>(records[at + 7] | records[at + 8] << 8);
        lowest = std::min<int>(lowest, power);
        highest = std::max<int>(highest, power);
    }
    EXPECT_EQ(lowest, -25);
    EXPECT_EQ(highest, -15);
}

TEST(SpectralModule, CountsMoreChannelsThanItCanGive) {
    std::string channels = "1";
    for (int i = 1; i < 300; ++i)
        channels += ", 1";
    Module module("{'spectrum': {'channels': [" + channels + "]}}");
    EXPECT_EQ(module.send(channelListRequest(), 2091), ERROR_INSUFFICIENT_BUFFER);
    EXPECT_EQ(module.send(channelListRequest(), 2092), ERROR_SUCCESS);
    ASSERT_EQ(module.output.size(), 2092U);
    EXPECT_EQ(at(module.output, 40, 2), "2c01");
    EXPECT_EQ(module.output[46 + 8 * 255], 1);
}

TEST(SpectralModule, RefusesWhatIsNotWellFormedAndEverythingWithoutASpectrum) {
    {
        Module module("{'spectrum': {}}");
        EXPECT_EQ(module.scan("02000000"), ERROR_INVALID_PARAMETER);
        EXPECT_EQ(module.send({}), ERROR_INVALID_PARAMETER);
        EXPECT_EQ(module.send(Bytes(32)), ERROR_INVALID_PARAMETER);
        for (const std::size_t wrong : {0U, 4U, 12U, 32U, 28U, 24U}) {
            Bytes request = channelListRequest();
            request[wrong] ^= 0xFF;
            EXPECT_EQ(module.send(request), ERROR_INVALID_PARAMETER) << wrong;
        }
    }
    Module missing("{}");
    EXPECT_EQ(missing.start(), ERROR_NOT_SUPPORTED);
    EXPECT_EQ(missing.send(channelListRequest()), ERROR_NOT_SUPPORTED);
}

}  // namespace
}  // namespace vexa::simulation
