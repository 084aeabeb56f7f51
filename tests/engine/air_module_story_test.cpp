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
STORY(AirModule, AnAnswerAboutABssIsReadWithinItsBytes, air({network(1, "Airport", tls())})) {
    const Block list = realmList({realmData("b.example", {eapMethod(21)})});
    const auto length = static_cast<unsigned>(list.size());
    const std::string noSize =
        "ERROR: Output buffer overflow in fetchBssAnqpInfo:No room for realm size field.\n";
    const std::string noName = "ERROR: Output buffer overflow in fetchBssAnqpInfo.No room for realm name\n";
    settle(story);
    const auto expectRead = [&](const char* what, const Block& bytes, const std::string& line,
                                const char* wanted = "Airport[a.example TLS]") {
        story.about(what);
        story.perform(kReport);
        story.forget();
        story.play({reply("anqpInfo", bytes), on("reportAnqp", 1)});
        story.expectLog(
            "Fetching BSS with ssid=Airport and mac address=02:aa:00:00:00:01  ANQP info "
            "from HS20 IHV...");
        story.expectOfLog(line, story.messages().find(line) != std::string::npos, true);
        story.expect("list", askedList(story), wanted);
    };
    expectRead("nothing", {}, "");
    expectRead("one byte", Block(1), noSize);
    expectRead("three bytes", Block(3), noSize);
    expectRead("ten bytes in nine", number(10) + Block(9), noName);
    expectRead("a length without end", number(0xFFFFFFFF) + Block(20), noName);
    expectRead("no realm data", number(0) + Block(20), "No ANQP NAI realm info.\n");
    expectRead("ten bytes", number(10) + Block(10), "Parsing NAI Realm list from 02:aa:00:00:00:01\n");
    expectRead("a list and more", number(length) + list + Block(40), "\t\tb.example EAP-TTLS\n",
               "Airport[b.example TTLS]");
    expectRead("a list in part", number(length - 1) + list, "No room for NAI Realm Data (len=");
}

STORY(AirModule, TheAnswerWithTheListIsReadByWholeRecords, air({network(1, "Airport")})) {
    settle(story);
    const auto expectRead = [&](std::size_t size, const char* list, const std::vector<std::string>& lines) {
        story.about(std::to_string(size));
        story.perform(moduleMessage(2, bssRecord("02aa00000009", "Airport")));
        story.forget();
        story.play({reply("bssList", cut(kTwo, size)), moduleMessage(4, {})});
        story.expectLines(lines);
        story.expect("list", askedList(story), list);
    };
    expectRead(104, "One Two", {"Get 2 HS20 networks from IHV"});
    expectRead(103, "One", {"Get 1 HS20 networks from IHV"});
    expectRead(52, "One", {"Get 1 HS20 networks from IHV"});
    expectRead(51, "Airport",
               {"Get 0 HS20 networks from IHV", "ERROR: Update HS20 network list failed.",
                "Error: getHs20BssListFromIHV failed in hs20Associate."});
    expectRead(0, "Airport", {"Get HS20 BSS list from IHV.", "dwBytesWritten equals 0."});
}

STORY(AirModule, ARequestThatFailsLeavesItsLineAndChangesNothing,
      air({network(1, "Airport", tls()), network(2, "Cafe", ttls("c.example"))})) {
    settle(story, {failing("WlanIhvControl", 31, R"("match":"bssList")"), moduleMessage(4, {})});
    story.expectOfLog("log", story.messages(),
                      "IHV reports HS20 network query ANQP info completed.\n"
                      "Get HS20 BSS list from IHV.\n"
                      "WlanIhvControl failed with error code=31\n"
                      "Error: getHs20BssListFromIHV failed in hs20Associate.\n");
    story.expect("heard", heard(story), "");
    story.play({on("setNetwork", 1, tls("x.example")), on("setNetwork", 2, tls("y.example")),
                failing("WlanIhvControl", 31, R"("match":"anqpInfo")"), kReport});
    story.expect("heard", heard(story), "networks Airport[a.example TLS] Cafe[y.example TLS]");
}

STORY(AirModule, AReportIsAsLongAsItClaimsAndNoLongerThanItsBlock,
      air({network(1, "One"), network(2, "Two")})) {
    settle(story);
    const auto expectHeard = [&](unsigned claimed, std::size_t sent, const std::string& wanted) {
        story.about(std::to_string(claimed) + " of " + std::to_string(sent));
        story.forget();
        story.perform(moduleMessage(2, cut(kTwo, sent), claimed));
        story.expect("heard", heard(story), wanted);
        if (wanted.empty())
            story.expectOfLog(
                "log", story.messages(),
                "IHV reports HS20 network list changed.\nERROR: Update HS20 network list failed.\n");
        story.advance(0ms);
    };
    expectHeard(104, 104, "networks One Two");
    expectHeard(103, 104, "networks One");
    expectHeard(4294967295U, 104, "DETECTED_HOTSPOT; networks One Two");
    expectHeard(104, 103, "networks One");
    for (const unsigned tooFew : {51U, 0U})
        expectHeard(tooFew, 104, "");
    for (const std::size_t tooFew : {51U, 0U})
        expectHeard(104, tooFew, "");
}

STORY(AirModule, NewsOfOneBssNeedsItsAddressAndItsMark, air({network(1, "Airport")})) {
    const Block record = bssRecord("02aa00000001", "Airport");
    settle(story);
    const auto expectFetches = [&](int wanted, const char* what, const Block& payload, unsigned claimed) {
        story.about(what);
        story.perform(moduleMessage(3, payload, claimed));
        story.expectLog("IHV reports HS20 BSS ANQP info changed.");
        story.expect("fetches", moduleRequests(story, 8), wanted);
        story.expect("heard", heard(story), "");
        story.forget();
    };
    expectFetches(1, "a record", record, 52);
    expectFetches(1, "its first 44 bytes", cut(record, 44), 44);
    expectFetches(1, "a claim of 44", record, 44);
    expectFetches(0, "its first 43 bytes", cut(record, 43), 43);
    expectFetches(0, "a claim beyond 43 bytes", cut(record, 43), 52);
    expectFetches(0, "a claim of 43", record, 43);
    expectFetches(0, "nothing", {}, 0);
    expectFetches(0, "no hotspot", bssRecord("02aa00000001", "Airport", 0), 52);
    expectFetches(0, "another mark", bssRecord("02aa00000001", "Airport", 2), 52);
    expectFetches(0, "an unknown address", bssRecord("02aa00000009", "Airport"), 52);
}

STORY(AirModule, TheRequestsAreMadeByteForByte,
      air({network(1, "Airport", R"("hs20":false,"networkType":3,"internetAccess":9)")})) {
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
    const std::string printed = story.printed();
    story.expect("printed", printed.substr(printed.find("Previous")),
                 "PreviousState=3 \nCurrentState=5 \nPreviousState=8 \nCurrentState=7 \n");
}

STORY(AirModule, SubtypesThatNobodyKnowsAreIgnored, air({network(1, "Airport")})) {
    settle(story);
    for (const unsigned subtype : {0U, 7U, 8U, 0x80000001U, 0xFFFFFFFFU})
        story.perform(moduleMessage(subtype, bssRecord("02aa00000001", "Airport")));
    story.expectOfLog("log", story.messages(), "");
    story.expect("heard", heard(story), "");
}

STORY(AirModule, AnUpdateRunsThroughItsStepsInOrder,
      air({network(1, "Airport"), network(2, "Airport", tls())})) {
    const std::string fetching = "Fetching BSS with ssid=Airport and mac address=02:aa:00:00:00:0";
    settle(story, {kReport});
    story.expectLog(
        "IHV reports HS20 network list changed.",
        "There already exists a network with ssid=Airport, updating network info....",
        "We scanned a new HS20 network with ssid=Airport, adding to the network list...", "\tssid=Airport",
        fetching + "1  ANQP info from HS20 IHV...", "ANQP info fetched from IHV: ____",
        "No ANQP NAI realm info.", fetching + "2  ANQP info from HS20 IHV...",
        "ANQP info fetched from IHV: __________a.example____",
        "Parsing NAI Realm list from 02:aa:00:00:00:02", "\tParsing NAI Realm...", "\tNAI Realm Count: 1",
        "\tNAI Realm=a.example", "\t\tEAP Method: len=2 method=13 auth_count=0",
        "\tWe have parsed 1 realms:", "\t\ta.example EAP-TLS", "Processing duplicated HS20 networks...",
        "Found duplicate HS20 networks with same ssid=Airport", "\tMacAddress=02:aa:00:00:00:01",
        "\tMacAddress=02:aa:00:00:00:02",
        "This network with index=0 and mac address02:aa:00:00:00:01 exists before, thus we will keep it.",
        "\tSet events m_hHs20NetworkChangedEvent and m_hAnqpInfoReadyEvent.",
        "Send all HS20 networks to vexa.");
}

}  // namespace
}  // namespace vexa::test
