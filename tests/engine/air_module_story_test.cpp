#include <gtest/gtest.h>

#include "engine/world/ConnectStory.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;

const Block kTwo = bssRecord("02aa00000001", "One") + bssRecord("02aa00000002", "Two");

Block cut(const Block& block, std::size_t size) {
    return {block.begin(), block.begin() + static_cast<std::ptrdiff_t>(size)};
}

Block number(unsigned value) {
    Block bytes(4);
    writeLittleEndian(std::span(bytes), 0, value);
    return bytes;
}

// What the module's answer to the question for one BSS leads to.
TEST(AirModule, AnAnswerAboutABssIsReadWithinItsBytes) {
    const Block list = realmList({realmData("b.example", {eapMethod(21)})});
    const auto length = static_cast<unsigned>(list.size());
    const char* const old = "Airport[a.example TLS]";
    const char* const noSize =
        "ERROR: Output buffer overflow in fetchBssAnqpInfo:No room for realm size field.\n";
    const char* const noName = "ERROR: Output buffer overflow in fetchBssAnqpInfo.No room for realm name\n";
    struct Case {
        const char* what;
        Block reply;
        const char* list;
        const char* line;
    };
    const Case cases[] = {
        {"nothing", {}, old, ""},
        {"one byte", Block(1), old, noSize},
        {"three bytes", Block(3), old, noSize},
        {"ten bytes in nine", number(10) + Block(9), old, noName},
        {"a length without end", number(0xFFFFFFFF) + Block(20), old, noName},
        {"no realm data", number(0) + Block(20), old, "No ANQP NAI realm info.\n"},
        {"ten bytes", number(10) + Block(10), old, "Parsing NAI Realm list from 02:aa:00:00:00:01\n"},
        {"a list and more", number(length) + list + Block(40), "Airport[b.example TTLS]",
         "\t\tb.example EAP-TTLS\n"},
        {"a list in part", number(length - 1) + list, old, "No room for NAI Realm Data (len="},
    };
    EXPECT_STORY(air({network(1, "Airport", tls())}), [&](Story& story) {
        settle(story);
        for (const Case& c : cases) {
            story.about(c.what);
            story.perform(kReport);
            story.forget();
            story.play({reply("anqpInfo", c.reply), on("reportAnqp", 1)});
            story.expectLog(
                {"Fetching BSS with ssid=Airport and mac address=02:aa:00:00:00:01  ANQP info "
                 "from HS20 IHV..."});
            story.expect("line", story.messages().find(c.line) != std::string::npos, true);
            story.expect("list", askedList(story), c.list);
        }
    });
}

TEST(AirModule, TheAnswerWithTheListIsReadByWholeRecords) {
    struct Case {
        std::size_t size;
        const char* list;
        std::vector<std::string> lines;
    };
    const Case cases[] = {
        {104, "One Two", {"Get 2 HS20 networks from IHV"}},
        {103, "One", {"Get 1 HS20 networks from IHV"}},
        {52, "One", {"Get 1 HS20 networks from IHV"}},
        {51,
         "Airport",
         {"Get 0 HS20 networks from IHV", "ERROR: Update HS20 network list failed.",
          "Error: getHs20BssListFromIHV failed in hs20Associate."}},
        {0, "Airport", {"Get HS20 BSS list from IHV.", "dwBytesWritten equals 0."}},
    };
    EXPECT_STORY(air({network(1, "Airport")}), [&](Story& story) {
        settle(story);
        for (const Case& c : cases) {
            story.about(std::to_string(c.size));
            story.perform(moduleMessage(2, bssRecord("02aa00000009", "Airport")));
            story.forget();
            story.play({reply("bssList", cut(kTwo, c.size)), moduleMessage(4, {})});
            story.expectLog(c.lines);
            story.expect("list", askedList(story), c.list);
        }
    });
}

STORY(AirModule, ARequestThatFailsLeavesItsLineAndChangesNothing,
      air({network(1, "Airport", tls()), network(2, "Cafe", ttls("c.example"))})) {
    settle(story);
    story.play({failing("WlanIhvControl", 31, R"("match":"bssList")"), moduleMessage(4, {})});
    story.expect("log", story.messages(),
                 "IHV reports HS20 network query ANQP info completed.\n"
                 "Get HS20 BSS list from IHV.\n"
                 "WlanIhvControl failed with error code=31\n"
                 "Error: getHs20BssListFromIHV failed in hs20Associate.\n");
    story.expect("heard", heard(story), "");
    story.play({on("setNetwork", 1, tls("x.example")), on("setNetwork", 2, tls("y.example")),
                failing("WlanIhvControl", 31, R"("match":"anqpInfo")"), kReport});
    story.expect("heard", heard(story), "networks Airport[a.example TLS] Cafe[y.example TLS]");
}

TEST(AirModule, AReportIsAsLongAsItClaimsAndNoLongerThanItsBlock) {
    struct Case {
        unsigned claimed;
        std::size_t sent;
        std::string heard;
    };
    const Case cases[] = {
        {104, 104, "networks One Two"},
        {103, 104, "networks One"},
        {4294967295U, 104, "DETECTED_HOTSPOT; networks One Two"},
        {104, 103, "networks One"},
        {51, 104, ""},
        {0, 104, ""},
        {104, 51, ""},
        {104, 0, ""},
    };
    EXPECT_STORY(air({network(1, "One"), network(2, "Two")}), [&](Story& story) {
        settle(story);
        for (const Case& c : cases) {
            story.about(std::to_string(c.claimed) + " of " + std::to_string(c.sent));
            story.forget();
            story.perform(moduleMessage(2, cut(kTwo, c.sent), c.claimed));
            story.expect("heard", heard(story), c.heard);
            if (c.heard.empty())
                story.expect(
                    "log", story.messages(),
                    "IHV reports HS20 network list changed.\nERROR: Update HS20 network list failed.\n");
            story.advance(0ms);
        }
    });
}

TEST(AirModule, NewsOfOneBssNeedsItsAddressAndItsMark) {
    const Block record = bssRecord("02aa00000001", "Airport");
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
    EXPECT_STORY(air({network(1, "Airport")}), [&](Story& story) {
        settle(story);
        for (const Case& c : cases) {
            story.about(c.what);
            story.perform(moduleMessage(3, c.payload, c.claimed));
            story.expectLog({"IHV reports HS20 BSS ANQP info changed."});
            story.expect("fetches", moduleRequests(story, 8), c.fetches);
            story.expect("heard", heard(story), "");
            story.forget();
        }
    });
}

TEST(AirModule, TheRequestsAreMadeByteForByte) {
    const std::string airport = network(1, "Airport", R"("hs20":false,"networkType":3,"internetAccess":9)");
    EXPECT_STORY(air({airport}), [](Story& story) {
        settle(story);
        story.act("completeAnqpQuery");
        std::string requests;
        for (const Json::Value& call : story.perform(R"({"query":"calls"})"))
            requests += call["type"].asString() + " " + call["outSize"].asString() + " " +
                        call["inHex"].asString() + "\n";
        story.expect("requests", requests,
                     "0 10240 005ec40300000000050000000000000000000000\n"
                     "0 10240 005ec403000000000800000034000000" +
                         hexOf(bssRecord("02aa00000001", "Airport", 1, 3, 9)) + "\n");
    });
}

STORY(AirModule, TheDriversStateIsPassedOnWhereItsTwoNumbersAre, "{}") {
    settle(story);
    const auto expectHeard = [&](const std::string& action, const std::string& wanted) {
        story.perform(action);
        std::string text;
        for (const ClientEvent& event : story.hotspot().events())
            text += event.id + " " + event.data["PreviousState"].asString() + ">" +
                    event.data["CurrentState"].asString() + " " + std::to_string(event.data.size());
        story.expect(action, text, wanted);
    };
    const std::string state = doing("driverState", R"("current":5,"previous":3)");
    expectHeard(state, "SUPPLICANT_STATE_CHANGE 3>5 2");
    expectHeard(moduleMessage(1, bytesOfHex("07000000 08000000"), 0), "SUPPLICANT_STATE_CHANGE 8>7 2");
    expectHeard(moduleMessage(1, bytesOfHex("07000000 080000"), 8), "");
    expectHeard(moduleMessage(1, {}, 0), "");
    story.act("pullAdapter");
    story.forget();
    expectHeard(state, "");
}

STORY(AirModule, SubtypesThatNobodyKnowsAreIgnored, air({network(1, "Airport")})) {
    settle(story);
    for (const unsigned subtype : {0U, 7U, 8U, 0x80000001U, 0xFFFFFFFFU})
        story.perform(moduleMessage(subtype, bssRecord("02aa00000001", "Airport")));
    story.expect("log", story.messages(), "");
    story.expect("heard", heard(story), "");
}

STORY(AirModule, AnUpdateRunsThroughItsStepsInOrder,
      air({network(1, "Airport"), network(2, "Airport", tls())})) {
    settle(story);
    story.perform(kReport);
    const std::string log = story.messages();
    story.expect(
        "log", log.substr(0, log.find("Send all HS20 networks to vexa.\n")),
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
        "This network with index=0 and mac address02:aa:00:00:00:01 exists before, thus we will keep "
        "it.\n"
        "\tSet events m_hHs20NetworkChangedEvent and m_hAnqpInfoReadyEvent.\n");
}

}  // namespace
}  // namespace vexa::test
