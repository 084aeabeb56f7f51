#include <gtest/gtest.h>

#include "engine/AirStory.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;

constexpr const char* kReport = R"({"do":"reportNetworks"})";

std::string reply(const std::string& match, const Block& bytes) {
    return R"({"do":"reply","match":")" + match + R"(","dataHex":")" + hexOf(bytes) + "\"}";
}

Block number(unsigned value) {
    Block bytes(4);
    writeLittleEndian(std::span(bytes), 0, value);
    return bytes;
}

// What the module's answer to the question for one BSS leads to.
TEST(AirModule, AnAnswerAboutABssIsReadWithinItsBytes) {
    const std::string head =
        "Fetching BSS with ssid=Airport and mac address=02:aa:00:00:00:01  ANQP info from HS20 IHV...\n";
    const Block list = realmList({realmData("b.example", {eapMethod(21)})});
    const auto length = static_cast<unsigned>(list.size());
    struct Case {
        const char* what;
        Block reply;
        const char* list;
        const char* line;
    };
    const Case cases[] = {
        {"nothing", {}, "Airport[a.example TLS]", ""},
        {"one byte", Block(1), "Airport[a.example TLS]",
         "ERROR: Output buffer overflow in fetchBssAnqpInfo:No room for realm size field.\n"},
        {"three bytes", Block(3), "Airport[a.example TLS]",
         "ERROR: Output buffer overflow in fetchBssAnqpInfo:No room for realm size field.\n"},
        {"ten bytes in nine", number(10) + Block(9), "Airport[a.example TLS]",
         "ERROR: Output buffer overflow in fetchBssAnqpInfo.No room for realm name\n"},
        {"a length without end", number(0xFFFFFFFF) + Block(20), "Airport[a.example TLS]",
         "ERROR: Output buffer overflow in fetchBssAnqpInfo.No room for realm name\n"},
        {"no realm data", number(0) + Block(20), "Airport[a.example TLS]", "No ANQP NAI realm info.\n"},
        {"ten bytes", number(10) + Block(10), "Airport[a.example TLS]",
         "Parsing NAI Realm list from 02:aa:00:00:00:01\n"},
        {"a list", number(length) + list, "Airport[b.example TTLS]", "\t\tb.example EAP-TTLS\n"},
        {"a list and more", number(length) + list + Block(40), "Airport[b.example TTLS]",
         "\t\tb.example EAP-TTLS\n"},
        {"a list in part", number(length - 1) + list, "Airport[a.example TLS]",
         "No room for NAI Realm Data (len="},
    };
    const Ending ending =
        runStory(1, air({network(1, "Airport", realms("a.example", "13"))}), [&](World& world) {
            std::string differences;
            settle(world);
            for (const Case& c : cases) {
                world.perform(kReport);
                const std::size_t before = world.logSize();
                world.hotspot().events();
                world.perform(reply("anqpInfo", c.reply));
                world.perform(on("reportAnqp", 1));
                const std::string got = messagesSince(world, before);
                const std::string now = askedList(world);
                if (got.find(head) == std::string::npos || got.find(c.line) == std::string::npos ||
                    now != c.list)
                    differences += std::string(c.what) + " gave " + now + "\n" + got;
            }
            return differences;
        });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "");
}

TEST(AirModule, TheAnswerWithTheListIsReadByWholeRecords) {
    const Block two = bssRecord("02aa00000001", "One") + bssRecord("02aa00000002", "Two");
    struct Case {
        std::size_t size;
        const char* list;
        const char* line;
    };
    const Case cases[] = {
        {104, "One Two", "Get 2 HS20 networks from IHV\n"},
        {103, "One", "Get 1 HS20 networks from IHV\n"},
        {52, "One", "Get 1 HS20 networks from IHV\n"},
        {51, "Airport",
         "Get 0 HS20 networks from IHV\nERROR: Update HS20 network list failed.\n"
         "Error: getHs20BssListFromIHV failed in hs20Associate.\n"},
        {0, "Airport", "Get HS20 BSS list from IHV.\ndwBytesWritten equals 0.\n"},
    };
    const Ending ending = runStory(2, air({network(1, "Airport")}), [&](World& world) {
        std::string differences;
        settle(world);
        for (const Case& c : cases) {
            world.perform(moduleMessage(2, bssRecord("02aa00000009", "Airport")));
            world.hotspot().events();
            const std::size_t before = world.logSize();
            world.perform(
                reply("bssList", Block(two.begin(), two.begin() + static_cast<std::ptrdiff_t>(c.size))));
            world.perform(moduleMessage(4, {}));
            const std::string got = messagesSince(world, before);
            const std::string now = askedList(world);
            if (got.find(c.line) == std::string::npos || now != c.list)
                differences += std::to_string(c.size) + " gave " + now + "\n" + got;
        }
        return differences;
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "");
}

TEST(AirModule, ARequestThatFailsLeavesItsLineAndChangesNothing) {
    const Ending ending =
        runStory(3,
                 air({network(1, "Airport", realms("a.example", "13")),
                      network(2, "Cafe", realms("c.example", "21"))}),
                 [](World& world) {
                     settle(world);
                     const std::size_t before = world.logSize();
                     world.perform(R"({"do":"fail","call":"WlanIhvControl","error":31,"match":"bssList"})");
                     world.perform(moduleMessage(4, {}));
                     std::string text = messagesSince(world, before) + heard(world) + "\n";
                     world.perform(on("setNetwork", 1, realms("x.example", "13")));
                     world.perform(on("setNetwork", 2, realms("y.example", "13")));
                     world.perform(R"({"do":"fail","call":"WlanIhvControl","error":31,"match":"anqpInfo"})");
                     world.perform(kReport);
                     return text + heard(world);
                 });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text,
              "IHV reports HS20 network query ANQP info completed.\n"
              "Get HS20 BSS list from IHV.\n"
              "WlanIhvControl failed with error code=31\n"
              "Error: getHs20BssListFromIHV failed in hs20Associate.\n"
              "\n"
              "GET_ALL_NETWORK_LIST Airport[a.example TLS] Cafe[y.example TLS]");
}

TEST(AirModule, AReportIsAsLongAsItClaimsAndNoLongerThanItsBlock) {
    const Block two = bssRecord("02aa00000001", "One") + bssRecord("02aa00000002", "Two");
    const std::string failed =
        "IHV reports HS20 network list changed.\nERROR: Update HS20 network list failed.\n";
    struct Case {
        unsigned claimed;
        std::size_t sent;
        std::string heard;
    };
    const Case cases[] = {
        {104, 104, "GET_ALL_NETWORK_LIST One Two"},
        {4294967295U, 104, "GET_ALL_NETWORK_LIST One Two"},
        {103, 104, "GET_ALL_NETWORK_LIST One"},
        {104, 103, "GET_ALL_NETWORK_LIST One"},
        {51, 104, ""},
        {0, 104, ""},
        {104, 51, ""},
        {104, 0, ""},
    };
    const Ending ending = runStory(4, air({network(1, "One"), network(2, "Two")}), [&](World& world) {
        std::string differences;
        settle(world);
        for (const Case& c : cases) {
            world.advance(0ms);
            const std::size_t before = world.logSize();
            world.perform(moduleMessage(
                2, Block(two.begin(), two.begin() + static_cast<std::ptrdiff_t>(c.sent)), c.claimed));
            std::string got = heard(world);
            if (got.starts_with("DETECTED_HOTSPOT; ")) got = got.substr(18);
            const std::string lines = messagesSince(world, before);
            if (got != c.heard || (c.heard.empty() && lines != failed))
                differences +=
                    std::to_string(c.claimed) + "/" + std::to_string(c.sent) + " gave " + got + lines;
        }
        return differences;
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "");
}

TEST(AirModule, NewsOfOneBssNeedsItsAddressAndItsMark) {
    const Block record = bssRecord("02aa00000001", "Airport");
    const auto cut = [](const Block& block, std::size_t size) {
        return Block(block.begin(), block.begin() + static_cast<std::ptrdiff_t>(size));
    };
    struct Case {
        const char* what;
        Block payload;
        unsigned claimed;
        int fetches;
    };
    const Case cases[] = {
        {"a record", record, 52, 1},
        {"its first 44 bytes", cut(record, 44), 44, 1},
        {"a claim of 44", record, 44, 1},
        {"its first 43 bytes", cut(record, 43), 43, 0},
        {"a claim beyond 43 bytes", cut(record, 43), 52, 0},
        {"a claim of 43", record, 43, 0},
        {"nothing", {}, 0, 0},
        {"no hotspot", bssRecord("02aa00000001", "Airport", 0), 52, 0},
        {"another mark", bssRecord("02aa00000001", "Airport", 2), 52, 0},
        {"an unknown address", bssRecord("02aa00000009", "Airport"), 52, 0},
    };
    const Ending ending = runStory(5, air({network(1, "Airport")}), [&](World& world) {
        std::string differences;
        settle(world);
        for (const Case& c : cases) {
            world.perform(R"({"do":"clearCalls"})");
            const std::size_t before = world.logSize();
            world.perform(moduleMessage(3, c.payload, c.claimed));
            const std::string lines = messagesSince(world, before);
            if (moduleRequests(world, 8) != c.fetches ||
                !lines.starts_with("IHV reports HS20 BSS ANQP info changed.\n"))
                differences +=
                    std::string(c.what) + " gave " + std::to_string(moduleRequests(world, 8)) + lines;
        }
        return differences + heard(world);
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "");
}

TEST(AirModule, TheRequestsAreMadeByteForByte) {
    const Ending ending =
        runStory(6, air({network(1, "Airport", R"("hs20":false,"networkType":3,"internetAccess":9)")}),
                 [](World& world) {
                     settle(world);
                     world.perform(R"({"do":"clearCalls"})");
                     world.perform(R"({"do":"completeAnqpQuery"})");
                     std::string text;
                     for (const Json::Value& call : world.perform(R"({"query":"calls"})"))
                         text += call["type"].asString() + " " + call["outSize"].asString() + " " +
                                 call["inHex"].asString() + "\n";
                     return text;
                 });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "0 10240 005ec4030000000005000000" + std::string(16, '0') +
                               "\n0 10240 005ec403000000000800000034000000" +
                               hexOf(bssRecord("02aa00000001", "Airport", 1, 3, 9)) + "\n");
}

TEST(AirModule, TheDriversStateIsPassedOnWhereItsTwoNumbersAre) {
    const Ending ending = runStory(7, "{}", [](World& world) {
        settle(world);
        std::string text;
        const auto tell = [&](const std::string& action) {
            world.perform(action);
            for (const ClientEvent& event : world.hotspot().events())
                text += event.id + " " + event.data["PreviousState"].asString() + ">" +
                        event.data["CurrentState"].asString() + " " + std::to_string(event.data.size());
            text += "\n";
        };
        tell(R"({"do":"driverState","current":5,"previous":3})");
        tell(moduleMessage(1, bytesOfHex("07000000 08000000"), 0));
        tell(moduleMessage(1, bytesOfHex("07000000 080000"), 8));
        tell(moduleMessage(1, {}, 0));
        world.perform(R"({"do":"pullAdapter"})");
        world.hotspot().events();
        tell(R"({"do":"driverState","current":5,"previous":3})");
        return text;
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text,
              "SUPPLICANT_STATE_CHANGE 3>5 2\n"
              "SUPPLICANT_STATE_CHANGE 8>7 2\n"
              "\n\n\n");
}

TEST(AirModule, SubtypesThatNobodyKnowsAreIgnored) {
    const Ending ending = runStory(8, air({network(1, "Airport")}), [](World& world) {
        settle(world);
        const std::size_t before = world.logSize();
        for (const unsigned subtype : {0U, 7U, 8U, 0x80000001U, 0xFFFFFFFFU})
            world.perform(moduleMessage(subtype, bssRecord("02aa00000001", "Airport")));
        return messagesSince(world, before) + heard(world);
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "");
}

TEST(AirModule, AnUpdateRunsThroughItsStepsInOrder) {
    const Ending ending = runStory(
        9, air({network(1, "Airport"), network(2, "Airport", realms("a.example", "13"))}), [](World& world) {
            settle(world);
            const std::size_t before = world.logSize();
            world.perform(kReport);
            std::string text = messagesSince(world, before);
            const std::size_t end = text.find("Send all HS20 networks to vexa.\n");
            return text.substr(0, end);
        });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(
        ending.text,
        "IHV reports HS20 network list changed.\n"
        "There already exists a network with ssid=Airport, updating network info....\n"
        "We scanned a new HS20 network with ssid=Airport, adding to the network list...\n"
        "\tssid=Airport\n"
        "Fetching BSS with ssid=Airport and mac address=02:aa:00:00:00:01  ANQP info from HS20 IHV...\n"
        "ANQP info fetched from IHV: ____\n"
        "No ANQP NAI realm info.\n"
        "Fetching BSS with ssid=Airport and mac address=02:aa:00:00:00:02  ANQP info from HS20 IHV...\n"
        "ANQP info fetched from IHV: __________a.example____\n"
        "Parsing NAI Realm list from 02:aa:00:00:00:02\n"
        "\tParsing NAI Realm...\n"
        "\tNAI Realm Count: 1\n"
        "\tNAI Realm=a.example\n"
        "\t\tEAP Method: len=2 method=13 auth_count=0\n"
        "\tWe have parsed 1 realms:\n"
        "\t\ta.example EAP-TLS\n"
        "Processing duplicated HS20 networks...\n"
        "Found duplicate HS20 networks with same ssid=Airport\n"
        "\tMacAddress=02:aa:00:00:00:01\n"
        "\tMacAddress=02:aa:00:00:00:02\n"
        "This network with index=0 and mac address02:aa:00:00:00:01 exists before, thus we will keep it.\n"
        "\tSet events m_hHs20NetworkChangedEvent and m_hAnqpInfoReadyEvent.\n");
}

}  // namespace
}  // namespace vexa::test
