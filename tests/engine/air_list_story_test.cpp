#include <gtest/gtest.h>

#include "engine/world/ConnectStory.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;

/// An action, and what the client hears of it.
using Step = std::pair<std::string, std::string>;

void walk(Story& story, const std::vector<Step>& steps) {
    for (const auto& [action, wanted] : steps) {
        story.perform(action);
        story.expect(action, heard(story), wanted);
    }
}

void walks(const std::vector<std::string>& networks, const std::vector<Step>& steps) {
    EXPECT_STORY(air(networks), [&](Story& story) {
        settle(story);
        walk(story, steps);
    });
}

TEST(Air, GrowthIsAnnouncedOnceAndWhatWasKnownOfANetworkGoesWithIt) {
    walks({network(1, "Airport", both())},
          {{kReport, "networks Airport[a.example TLS,a.example TTLS]"},
           {adding(network(2, "Cafe")), ""},
           {kReport, "DETECTED_HOTSPOT; networks Airport[a.example TLS,a.example TTLS] Cafe"},
           {kReport, "networks Airport[a.example TLS,a.example TTLS] Cafe"},
           {on("hide", 1), ""},
           {kReport, "networks Cafe"},
           {on("setNetwork", 1, R"("anqp":"never")"), ""},
           {on("show", 1), ""},
           {kReport, "DETECTED_HOTSPOT; networks Airport Cafe"}});
}

TEST(Air, AnotherBssOfAKnownNameIsNoGrowthButBringsItsRealms) {
    const std::string all = "networks Airport[a.example TLS,a.example TTLS,b.example TLS,b.example TTLS]";
    walks({network(1, "Airport", tls())}, {{adding(network(2, "Airport", both("a.example;b.example"))), ""},
                                           {kReport, all},
                                           {on("hide", 1), ""},
                                           {kReport, all}});
}

TEST(Air, TheListFollowsTheOrderOfTheReportAndKnownNetworksKeepTheirNamesAndRealms) {
    const Block first = bssRecord("02aa00000001", "Airport");
    const Block second = bssRecord("02aa00000002", "Cafe");
    const Block renamed = bssRecord("02aa00000001", "Harbour");
    const Block moved = bssRecord("02aa00000003", "Airport");
    walks({network(1, "Airport", tls()), network(2, "Cafe")},
          {{moduleMessage(2, second + first), "networks Cafe Airport[a.example TLS]"},
           {moduleMessage(2, renamed), "networks Airport[a.example TLS]"},
           {on("setNetwork", 1, R"("naiRealmHex":"0100")"), ""},
           {moduleMessage(2, renamed), "networks Airport[a.example TLS]"},
           {moduleMessage(2, moved + renamed), "networks Airport[a.example TLS]"},
           {moduleMessage(2, moved), "networks Airport"}});
}

TEST(Air, RealmDataThatCanNotBeReadCountsAsFetchedAndLeavesTheRealms) {
    walks({network(1, "Airport", tls())}, {{on("setNetwork", 1, R"("naiRealmHex":"ff")"), ""},
                                           {kReport, "networks Airport[a.example TLS]"},
                                           {on("setNetwork", 1, R"("naiRealmHex":"0100050000016100ff")"), ""},
                                           {kReport, "networks Airport[]"},
                                           {on("setNetwork", 1, realms("sim.example", "18")), ""},
                                           {kReport, "networks Airport[]"}});
}

STORY(Air, WithTheFunctionOrTheRadioOffTheListIsNullAndWithoutAnAdapterThereIsNone,
      air({network(1, "Airport")})) {
    settle(story, {kHs20Off});
    story.expect("switched off", heard(story), "networks null; SET_HOTSPOT_AUTO_CONNECT");
    walk(story, {{adding(network(2, "Cafe")), ""}, {kReport, "networks null"}});
    story.play({kHs20On});
    story.expect("switched on", heard(story), "networks Airport Cafe; SET_HOTSPOT_AUTO_CONNECT");
    walk(story, {{kRadioOff, "GET_RADIO; networks null"}, {kReport, "networks null"}});
    story.expect("list", askedList(story), "null");
    walk(story, {{kRadioOn, "GET_RADIO; networks Airport Cafe"}});
    story.act("pullAdapter");
    story.expect("list", askedList(story), "nothing");
    story.order("GET_IS_INTERNET_ACCESS");
    story.play({kHs20Off});
    story.expect("heard without an adapter", heard(story), "SET_HOTSPOT_AUTO_CONNECT");
}

constexpr const char* kList = R"([
   {
      "IsConnected" : false,
      "IsInternetAccess" : 0,
      "NetWorkName" : "Airport",
      "NetworkType" : 7,
      "RealmFetched" : true,
      "SupportRealmList" : [
         {
            "CredentialEapMethod" : 2,
            "RealmName" : "a.example"
         }
      ]
   },
   {
      "IsConnected" : false,
      "IsInternetAccess" : 2,
      "NetWorkName" : "Cafe",
      "NetworkType" : 4294967295,
      "RealmFetched" : false
   }
]
)";

STORY(Air, TheListIsWrittenFieldByField, "{}") {
    settle(story);
    story.order("GET_ALL_NETWORK_LIST");
    story.expect("no list", story.hotspot().events().at(0).dataText, "null\n");
    story.play({adding(network(1, "Airport", R"("networkType":7,"internetAccess":0,)" + ttls())),
                adding(network(2, "Cafe", R"("networkType":4294967295,"internetAccess":5)")), kReport});
    const auto events = story.hotspot().events();
    story.expect("first", events.at(0).id + " " + events.at(0).source + " " + events.at(0).dataText,
                 "DETECTED_HOTSPOT HotSpot20 null\n");
    story.expect("list", events.at(1).dataText, kList);
}

}  // namespace
}  // namespace vexa::test
