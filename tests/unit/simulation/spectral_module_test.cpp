#include <gtest/gtest.h>

#include "TestMachine.h"

namespace vexa::simulation {
namespace {

constexpr DWORD kIhv = WLAN_NOTIFICATION_SOURCE_IHV;

/// The client's side of the module.
class Module {
public:
    explicit Module(const std::string& scenario) : machine(scenario) {}

    DWORD send(Bytes request) {
        const GUID guid = machine.guid();
        DWORD returned = 0;
        return WlanIhvControl(listener.handle(), &guid, wlan_ihv_control_type_driver,
                              static_cast<DWORD>(request.size()), request.data(), 0, nullptr, &returned);
    }

    DWORD control(int enable) {
        const std::string flag = enable == 1 ? "01000000" : enable == 0 ? "00000000" : "02000000";
        return send(
            *bytesFromHex("01000000"
                          "0b00a3ff"
                          "00000000"
                          "08000000"
                          "0000000000000000" +
                          flag + "00000000"));
    }

    DWORD start() { return control(1); }
    DWORD stop() { return control(0); }

    /// All data blocks, as hex.
    std::vector<std::string> blocks() {
        std::vector<std::string> out;
        for (const Heard& heard : listener.heard()) {
            if (heard.source == kIhv) out.push_back(hexText(heard.data));
        }
        return out;
    }

    TestMachine machine;
    Listener listener;
};

const std::string kCompleted =
    "005ec406"
    "00000000"
    "02000000"
    "325c0000";

std::string zeros(std::size_t bytes) {
    return std::string(bytes * 2, '0');
}

std::string repeated(const std::string& text, int times) {
    std::string out;
    for (int i = 0; i < times; ++i)
        out += text;
    return out;
}

Bytes channelListRequest() {
    Bytes request = *bytesFromHex(
        "00000000"
        "040050ff"
        "00000000"
        "14080000"
        "0000000000000000"
        "80011000"
        "08080000"
        "08080000"
        "00000000");
    request.resize(2092);
    return request;
}

TEST(SpectralModule, SamplesComeJustBeforeTheCompletion) {
    Module module(
        "{'spectrum': {'scanMs': 400, 'scans': [[{'frequency': 5180, 'congestion': 70, 'power': -2,"
        "'bins': 9}]]}}");
    EXPECT_EQ(module.start(), ERROR_SUCCESS);
    module.machine.advance(399);
    EXPECT_TRUE(module.blocks().empty());
    module.machine.advance(1);
    const std::string record =
        "3c14"
        "4600" +
        zeros(3) + "feff" + zeros(47) + repeated("09", 56) + zeros(124);
    const auto blocks = module.blocks();
    ASSERT_EQ(blocks.size(), 2U);
    EXPECT_EQ(blocks[0],
              "005ec406"
              "00000000"
              "01000000"
              "325c0000"
              "0100" +
                  record);
    EXPECT_EQ(blocks[1], kCompleted);
}

TEST(SpectralModule, TravelsInPartsOfSixteenRecords) {
    Module module(
        "{'spectrum': {'channels': [36, 1], 'recordsPerScan': 9,"
        "'levels': {'1': {'congestion': 30, 'power': 60}, '36': {'congestion': 70, 'power': 96}}}}");
    module.start();
    module.machine.advance(400);
    const auto blocks = module.blocks();
    ASSERT_EQ(blocks.size(), 3U);
    EXPECT_EQ(blocks[0].size(), 2 * (18U + 16 * 236));
    EXPECT_EQ(blocks[1].size(), 2 * (18U + 2 * 236));
    EXPECT_EQ(blocks[0].substr(32, 4), "1000");
    EXPECT_EQ(blocks[1].substr(32, 4), "0200");
    EXPECT_EQ(blocks[0].substr(36, 8), "3c144600");
    EXPECT_EQ(blocks[1].substr(36, 8), "6c091e00");
    EXPECT_EQ(blocks[1].substr(36 + 2 * 56, 112), repeated("64", 56));
}

TEST(SpectralModule, KnowsTheFrequenciesOfItsChannels) {
    struct Case {
        int channel;
        const char* frequency;
    };
    const Case cases[] = {{1, "6c09"}, {13, "a809"}, {14, "b409"}, {36, "3c14"}, {165, "c116"}};
    for (const Case& c : cases) {
        const std::string number = std::to_string(c.channel);
        Module module("{'spectrum': {'channels': [" + number + "], 'levels': {'" + number + "': {}}}}");
        module.start();
        module.machine.advance(400);
        ASSERT_EQ(module.blocks().size(), 2U) << c.channel;
        EXPECT_EQ(module.blocks()[0].substr(36, 4), c.frequency) << c.channel;
    }
}

TEST(SpectralModule, AStartDuringAScanChangesNothing) {
    Module module("{'spectrum': {}}");
    module.start();
    module.machine.advance(300);
    EXPECT_EQ(module.start(), ERROR_SUCCESS);
    module.machine.advance(100);
    EXPECT_EQ(module.blocks(), (std::vector<std::string>{kCompleted}));
    module.machine.advance(1000);
    EXPECT_EQ(module.blocks().size(), 1U);
}

TEST(SpectralModule, AStopEndsTheScanWithoutAWord) {
    Module module("{'spectrum': {}}");
    module.start();
    module.machine.advance(300);
    EXPECT_EQ(module.stop(), ERROR_SUCCESS);
    EXPECT_EQ(module.start(), ERROR_SUCCESS);
    module.machine.advance(399);
    EXPECT_TRUE(module.blocks().empty());
    module.machine.advance(1);
    EXPECT_EQ(module.blocks().size(), 1U);
}

TEST(SpectralModule, EndsItsScanWithTheAdapter) {
    Module module("{'spectrum': {}}");
    module.start();
    module.machine.ask("{'do': 'pullAdapter'}");
    EXPECT_EQ(module.start(), ERROR_NOT_FOUND);
    module.machine.ask("{'do': 'insertAdapter'}");
    module.machine.advance(1000);
    EXPECT_TRUE(module.blocks().empty());
    EXPECT_EQ(module.start(), ERROR_SUCCESS);
}

TEST(SpectralModule, MayNeverComplete) {
    Module module("{'spectrum': {'completes': false, 'scans': [[{}], [{}]]}}");
    for (std::size_t scan = 1; scan <= 2; ++scan) {
        module.start();
        module.machine.advance(400);
        ASSERT_EQ(module.blocks().size(), scan);
        EXPECT_EQ(module.blocks().back().substr(16, 8), "01000000");
    }
}

TEST(SpectralModule, ScansPastTheLastGiveNothingButTheirCompletion) {
    Module module("{'spectrum': {'scans': [[], [{'frequency': 1}]]}}");
    std::string sizes;
    for (int scan = 0; scan < 3; ++scan) {
        module.start();
        module.machine.advance(400);
    }
    for (const auto& block : module.blocks())
        sizes += std::to_string(block.size() / 2) + " ";
    EXPECT_EQ(sizes, "16 254 16 16 ");
}

TEST(SpectralModule, OneSeedGivesOneStory) {
    const auto story = [](const std::string& seed) {
        Module module(
            "{'seed': " + seed +
            ", 'spectrum': {'channels': [1, 6], 'levels': {"
            "'1': {'congestion': 50, 'power': -20, 'spread': 5}, '6': {'congestion': 2, 'spread': 4}}}}");
        for (int scan = 0; scan < 3; ++scan) {
            module.start();
            module.machine.advance(400);
        }
        return module.blocks();
    };
    EXPECT_EQ(story("3"), story("3"));
    EXPECT_NE(story("3"), story("4"));
}

TEST(SpectralModule, ValuesStayWithinTheirSpread) {
    Module module(
        "{'spectrum': {'channels': [1], 'recordsPerScan': 400, 'levels': {"
        "'1': {'congestion': 3, 'power': -20, 'spread': 5}}}}");
    module.start();
    module.machine.advance(400);
    int lowest = 99;
    int highest = -99;
    for (const Heard& heard : module.listener.heard()) {
        for (std::size_t at = 18; at < heard.data.size(); at += 236) {
            EXPECT_LE(heard.data[at + 2], 8);
            const auto power = static_cast<std::int16_t>(heard.data[at + 7] | heard.data[at + 8] << 8);
            lowest = std::min<int>(lowest, power);
            highest = std::max<int>(highest, power);
        }
    }
    EXPECT_EQ(lowest, -25);
    EXPECT_EQ(highest, -15);
}

TEST(SpectralModule, LevelsChangeFromNowOnAndKeepWhatIsNotNamed) {
    Module module(
        "{'spectrum': {'channels': [1], 'recordsPerScan': 1, 'levels': {'1': {'congestion': 3, 'power': "
        "7}}}}");
    EXPECT_EQ(module.machine.ask("{'do': 'levels', 'levels': {'1': {'congestion': 9}}}"), R"({"ok":true})");
    EXPECT_EQ(module.machine.ask("{'do': 'set', 'scanMs': 50}"), R"({"ok":true})");
    module.start();
    module.machine.advance(50);
    ASSERT_EQ(module.blocks().size(), 2U);
    EXPECT_EQ(module.blocks()[0].substr(36, 18),
              "6c09"
              "0900"
              "000000"
              "0700");
}

TEST(SpectralModule, GivesItsChannelsInPlaceOfTheRequest) {
    Module module("{'spectrum': {'channels': [36, 1, 36]}}");
    Bytes buffer = channelListRequest();
    const GUID guid = module.machine.guid();
    DWORD returned = 0;
    ASSERT_EQ(WlanIhvControl(module.listener.handle(), &guid, wlan_ihv_control_type_driver, 2092,
                             buffer.data(), 2092, buffer.data(), &returned),
              ERROR_SUCCESS);
    EXPECT_EQ(returned, 2092U);
    Bytes expected = channelListRequest();
    expected[40] = 3;
    expected[46] = 36;
    expected[54] = 1;
    expected[62] = 36;
    EXPECT_EQ(buffer, expected);
    EXPECT_EQ(WlanIhvControl(module.listener.handle(), &guid, wlan_ihv_control_type_driver, 2092,
                             channelListRequest().data(), 2091, buffer.data(), &returned),
              ERROR_INSUFFICIENT_BUFFER);
}

TEST(SpectralModule, CountsMoreChannelsThanItCanGive) {
    std::string channels = "1";
    for (int i = 1; i < 300; ++i)
        channels += ", 1";
    Module module("{'spectrum': {'channels': [" + channels + "]}}");
    Bytes buffer = channelListRequest();
    const GUID guid = module.machine.guid();
    DWORD returned = 0;
    WlanIhvControl(module.listener.handle(), &guid, wlan_ihv_control_type_driver, 2092, buffer.data(), 2092,
                   buffer.data(), &returned);
    EXPECT_EQ(buffer[40] | buffer[41] << 8, 300);
    EXPECT_EQ(buffer[46 + 8 * 255], 1);
}

TEST(SpectralModule, RefusesWhatIsNotWellFormed) {
    Module module("{'spectrum': {}}");
    EXPECT_EQ(module.control(2), ERROR_INVALID_PARAMETER);
    EXPECT_EQ(module.send({}), ERROR_INVALID_PARAMETER);
    EXPECT_EQ(module.send(Bytes(32)), ERROR_INVALID_PARAMETER);
    for (const std::size_t wrong : {0U, 4U, 12U, 32U, 28U, 24U}) {
        Bytes request = channelListRequest();
        request[wrong] ^= 0xFF;
        EXPECT_EQ(module.send(request), ERROR_INVALID_PARAMETER) << wrong;
    }
}

TEST(SpectralModule, IsMissingWithoutASpectrum) {
    Module module("{}");
    EXPECT_EQ(module.start(), ERROR_NOT_SUPPORTED);
    EXPECT_EQ(module.send(channelListRequest()), ERROR_NOT_SUPPORTED);
    EXPECT_EQ(module.send(Bytes(32)), ERROR_INVALID_PARAMETER);
}

}  // namespace
}  // namespace vexa::simulation
