#include "client/hotspot/HotspotNarrator.h"

#include <gtest/gtest.h>

#include "client/hotspot/Credential.h"

namespace vexa::client {
namespace {

// Networks as the service lists them: one with a star is the connected one, one with a colon tells its realm.
Event list(const std::vector<std::string>& networks) {
    std::string text;
    for (const std::string& network : networks) {
        const bool isConnected = network.find('*') != std::string::npos;
        const std::size_t colon = network.find(':');
        text += (text.empty() ? "" : ",") + (R"({"NetWorkName":")" + network.substr(0, 1)) +
                R"(","IsConnected":)" + (isConnected ? "true" : "false");
        if (colon != std::string::npos)
            text += R"(,"RealmFetched":true,"SupportRealmList":[{"CredentialEapMethod":2,"RealmName":")" +
                    network.substr(colon + 1) + "\"}]";
        text += "}";
    }
    return {"GET_ALL_NETWORK_LIST", "[" + text + "]", "HotSpot20"};
}

Event credentials(const std::vector<std::string>& names) {
    Credential credential;
    credential.type = kTypeUser;
    credential.method = kMethodTtls;
    credential.realm = "r";
    credential.username = credential.password = "u";
    std::string text;
    for (const std::string& name : names) {
        credential.name = name;
        ++credential.id;
        text += (text.empty() ? "" : ",") + credentialData(credential);
    }
    return {"GET_ALL_CREDENTIAL_LIST", "[" + text + "]", "HotSpot20"};
}

Event event(const char* id, const char* data = "") {
    return {id, data, "HotSpot20"};
}

using Steps = std::vector<std::pair<Event, std::string>>;

// The sentences of each step are given in one text.
void expectTold(HotspotNarrator& narrator, const Steps& steps) {
    for (std::size_t i = 0; i < steps.size(); ++i) {
        std::string told;
        for (const std::string& sentence : narrator.tell(steps[i].first))
            told += (told.empty() ? "" : "; ") + sentence;
        EXPECT_EQ(told, steps[i].second) << "step " << i;
    }
}

TEST(HotspotNarrator, TellsWhatIsNewInAList) {
    HotspotNarrator narrator([] { return 2; });
    expectTold(narrator, {{credentials({"Pocket"}), "1 credential stored"},
                          {list({"A", "B"}), R"(hotspots in range: "A", "B")"},
                          {list({"A", "B"}), ""},
                          {list({"A:r", "B"}), R"(realms of "A": r (TTLS))"},
                          {list({"A*:r", "B"}), R"(joined "A" with the credential "Pocket")"},
                          {list({"B*", "C:x"}),
                           R"(the connection to "A" has ended; "A" is out of range; )"
                           R"("C" is in range; realms: x (TTLS); joined "B", with no credential of ours)"},
                          {event("GET_ALL_NETWORK_LIST", "null\n"),
                           R"(the connection to "B" has ended; "B" is out of range; "C" is out of range)"}});
    EXPECT_EQ(narrator.joined(), (std::vector<std::string>{"A", "B"}));
}

TEST(HotspotNarrator, AConnectionThatWasThereIsNotJoined) {
    HotspotNarrator narrator([] { return std::nullopt; });
    expectTold(narrator, {{credentials({"One", "Two"}), "2 credentials stored"},
                          {list({"A*:r"}), R"(hotspots in range: "A"; )"
                                           R"(connected to "A" with the credential "One" or "Two")"}});
    EXPECT_TRUE(narrator.joined().empty());
}

TEST(HotspotNarrator, ASuccessIsToldByTheListThatFollows) {
    HotspotNarrator narrator([] { return 2; });
    expectTold(narrator, {{list({"A"}), R"(hotspots in range: "A")"},
                          {event("CONNECT_DISCONNECT", "1\n"), ""},
                          {list({"A"}), "the system has tried a connection of its own"},
                          {list({"A"}), ""},
                          {event("CONNECT_DISCONNECT", "0\n"), "an attempt to connect has failed"},
                          {list({"A"}), ""},
                          {event("CONNECT_DISCONNECT", "1\n"), ""},
                          {list({"A*"}), R"(joined "A", with no credential of ours)"}});
    EXPECT_EQ(narrator.takeQuestions().size(), 3U) << "a list for each result";
    EXPECT_TRUE(narrator.takeQuestions().empty());
}

TEST(HotspotNarrator, SaysOnceWhatIsToldTwice) {
    HotspotNarrator narrator([] { return 2; });
    expectTold(narrator, {{event("CARD_PLUG_IN"), "the adapter is in"},
                          {event("CARD_PLUG_IN"), ""},
                          {event("CARD_PLUG_OUT"), "the adapter is out"},
                          {event("CARD_PLUG_OUT"), ""},
                          {event("GET_RADIO", "true\n"), "the radio is on"},
                          {event("GET_RADIO", "true\n"), ""},
                          {event("GET_RADIO", "false\n"), "the radio is off"},
                          {event("GET_RADIO", "7\n"), ""},
                          {event("GET_IS_INTERNET_ACCESS", "false\n"), "the internet is not reached"},
                          {event("GET_IS_INTERNET_ACCESS", "true\n"), "the internet is reached"}});
    EXPECT_TRUE(narrator.takeQuestions().empty());
    narrator.tell(event("CARD_PLUG_IN"));
    EXPECT_EQ(narrator.takeQuestions().size(), 2U) << "an adapter that comes has networks and credentials";
}

TEST(HotspotNarrator, TellsChangesOfCredentialsAndAnythingElseAsItIs) {
    HotspotNarrator narrator([] { return 2; });
    expectTold(narrator, {{credentials({}), "0 credentials stored"},
                          {credentials({"A"}), R"(credential 1 "A" was added)"},
                          {credentials({"B"}), R"(credential 1 "B" was changed)"},
                          {credentials({"B"}), ""},
                          {credentials({}), R"(credential 1 "B" was deleted)"},
                          {event("DETECTED_HOTSPOT", "null\n"), "new hotspots were detected"},
                          {event("SET_HOTSPOT_AUTO_CONNECT", "false\n"), "hotspot networks are disabled"},
                          {event("SUPPLICANT_STATE_CHANGE", R"({"PreviousState":1,"CurrentState":3})"),
                           "the hotspot module went from state 1 to 3"},
                          {event("SUPPLICANT_STATE_CHANGE", "7"), ""},
                          {event("SOMETHING"), "SOMETHING"},
                          {event("SOMETHING", "{\n\"a\" : 1\n}\n"), R"(SOMETHING {"a":1})"},
                          {event("GET_ALL_NETWORK_LIST", "{"), "hotspots in range: none"}});
}

}  // namespace
}  // namespace vexa::client
