#include "client/hotspot/HotspotNarrator.h"

#include <gtest/gtest.h>

namespace vexa::client {
namespace {

using Sentences = std::vector<std::string>;

struct Network {
    const char* name;
    bool isConnected = false;
    const char* realm = nullptr;
};

Event list(const std::vector<Network>& networks) {
    std::string text;
    for (const Network& network : networks) {
        text += text.empty() ? "" : ",";
        text += R"({"NetWorkName":")" + std::string(network.name) + R"(","IsConnected":)" +
                (network.isConnected ? "true" : "false");
        if (network.realm != nullptr)
            text += R"(,"RealmFetched":true,"SupportRealmList":[{"CredentialEapMethod":2,"RealmName":")" +
                    std::string(network.realm) + "\"}]";
        text += "}";
    }
    return {"GET_ALL_NETWORK_LIST", "[" + text + "]", "HotSpot20"};
}

Event credentials(const std::vector<std::string>& names) {
    std::string text;
    int id = 0;
    for (const std::string& name : names)
        text +=
            (text.empty() ? "" : ",") +
            (R"({"Id":)" + std::to_string(++id) + R"(,"Type":1,"AccessType":1,"CredentialEapMethod":2,)" +
             R"("AutoConnect":true,"Creator":"","CaCert":"","ClientCert":"","Username":"u","Password":"p",)" +
             R"("RealName":"r","CredentialName":")" + name + "\"}");
    return {"GET_ALL_CREDENTIAL_LIST", "[" + text + "]", "HotSpot20"};
}

Event event(const char* id, const char* data = "") {
    return {id, data, "HotSpot20"};
}

struct Step {
    Event event;
    Sentences sentences;
};

void expectTold(HotspotNarrator& narrator, const std::vector<Step>& steps) {
    for (std::size_t i = 0; i < steps.size(); ++i)
        EXPECT_EQ(narrator.tell(steps[i].event), steps[i].sentences) << "step " << i;
}

HotspotNarrator narratorOf(std::optional<int> method) {
    return HotspotNarrator([method] { return method; });
}

TEST(HotspotNarrator, TellsWhatIsNewInAList) {
    auto narrator = narratorOf(2);
    expectTold(
        narrator,
        {{credentials({"Pocket"}), {"1 credential stored"}},
         {list({{"A"}, {"B"}}), {R"(hotspots in range: "A", "B")"}},
         {list({{"A"}, {"B"}}), {}},
         {list({{"A", false, "r"}, {"B"}}), {R"(realms of "A": r (TTLS))"}},
         {list({{"A", true, "r"}, {"B"}}), {R"(joined "A" with the credential "Pocket")"}},
         {list({{"B", true}, {"C", false, "x"}}),
          {R"(the connection to "A" has ended)", R"("A" is out of range)",
           R"("C" is in range; realms: x (TTLS))", R"(joined "B", with no credential of ours)"}},
         {event("GET_ALL_NETWORK_LIST", "null\n"),
          {R"(the connection to "B" has ended)", R"("B" is out of range)", R"("C" is out of range)"}}});
    EXPECT_EQ(narrator.joined(), (Sentences{"A", "B"}));
}

TEST(HotspotNarrator, AConnectionThatWasThereIsNotJoined) {
    auto narrator = narratorOf(std::nullopt);
    expectTold(narrator,
               {{credentials({"One", "Two"}), {"2 credentials stored"}},
                {list({{"A", true, "r"}}),
                 {R"(hotspots in range: "A")", R"(connected to "A" with the credential "One" or "Two")"}}});
    EXPECT_TRUE(narrator.joined().empty());
}

TEST(HotspotNarrator, ASuccessIsToldByTheListThatFollows) {
    auto narrator = narratorOf(2);
    expectTold(narrator, {{list({{"A"}}), {R"(hotspots in range: "A")"}},
                          {event("CONNECT_DISCONNECT", "1\n"), {}},
                          {list({{"A"}}), {"the system has tried a connection of its own"}},
                          {list({{"A"}}), {}},
                          {event("CONNECT_DISCONNECT", "0\n"), {"an attempt to connect has failed"}},
                          {list({{"A"}}), {}},
                          {event("CONNECT_DISCONNECT", "1\n"), {}},
                          {list({{"A", true}}), {R"(joined "A", with no credential of ours)"}}});
    EXPECT_EQ(narrator.takeQuestions().size(), 3U) << "a list for each result";
    EXPECT_TRUE(narrator.takeQuestions().empty());
}

TEST(HotspotNarrator, SaysOnceWhatIsToldTwice) {
    auto narrator = narratorOf(2);
    expectTold(narrator, {{event("CARD_PLUG_IN"), {"the adapter is in"}},
                          {event("CARD_PLUG_IN"), {}},
                          {event("CARD_PLUG_OUT"), {"the adapter is out"}},
                          {event("CARD_PLUG_OUT"), {}},
                          {event("GET_RADIO", "true\n"), {"the radio is on"}},
                          {event("GET_RADIO", "true\n"), {}},
                          {event("GET_RADIO", "false\n"), {"the radio is off"}},
                          {event("GET_RADIO", "7\n"), {}},
                          {event("GET_IS_INTERNET_ACCESS", "false\n"), {"the internet is not reached"}},
                          {event("GET_IS_INTERNET_ACCESS", "true\n"), {"the internet is reached"}},
                          {event("GET_IS_INTERNET_ACCESS", "true\n"), {}}});
    EXPECT_TRUE(narrator.takeQuestions().empty());
    narrator.tell(event("CARD_PLUG_IN"));
    EXPECT_EQ(narrator.takeQuestions().size(), 2U) << "an adapter that comes has networks and credentials";
}

TEST(HotspotNarrator, TellsChangesOfCredentials) {
    auto narrator = narratorOf(2);
    expectTold(narrator, {{credentials({}), {"0 credentials stored"}},
                          {credentials({"A"}), {R"(credential 1 "A" was added)"}},
                          {credentials({"B"}), {R"(credential 1 "B" was changed)"}},
                          {credentials({"B"}), {}},
                          {credentials({}), {R"(credential 1 "B" was deleted)"}}});
}

TEST(HotspotNarrator, AnythingElseIsToldAsItIs) {
    auto narrator = narratorOf(2);
    expectTold(narrator, {{event("DETECTED_HOTSPOT", "null\n"), {"new hotspots were detected"}},
                          {event("SET_HOTSPOT_AUTO_CONNECT", "false\n"), {"hotspot networks are disabled"}},
                          {event("SUPPLICANT_STATE_CHANGE", R"({"PreviousState":1,"CurrentState":3})"),
                           {"the hotspot module went from state 1 to 3"}},
                          {event("SUPPLICANT_STATE_CHANGE", "7"), {}},
                          {event("SOMETHING"), {"SOMETHING"}},
                          {event("SOMETHING", "{\n\"a\" : 1\n}\n"), {R"(SOMETHING {"a":1})"}},
                          {event("GET_ALL_NETWORK_LIST", "{"), {"hotspots in range: none"}}});
}

}  // namespace
}  // namespace vexa::client
