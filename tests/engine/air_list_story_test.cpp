#include <gtest/gtest.h>

#include "engine/AirStory.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;

constexpr const char* kReport = R"({"do":"reportNetworks"})";

// Carries out the actions, each followed by what the client heard of it.
std::string walk(World& world, const std::vector<std::string>& actions) {
    std::string text;
    for (const std::string& action : actions) {
        world.perform(action);
        text += heard(world) + "\n";
    }
    return text;
}

TEST(Air, GrowthIsAnnouncedOnceAndTheListGoesOutEachTime) {
    const Ending ending =
        runStory(1, air({network(1, "Airport", realms("a.example", "13,21"))}), [](World& world) {
            settle(world);
            return walk(world, {kReport, R"({"do":"addNetwork","network":)" + network(2, "Cafe") + "}",
                                kReport, kReport, on("hide", 1), kReport, on("show", 1), kReport});
        });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text,
              "GET_ALL_NETWORK_LIST Airport[a.example TLS,a.example TTLS]\n"
              "\n"
              "DETECTED_HOTSPOT; GET_ALL_NETWORK_LIST Airport[a.example TLS,a.example TTLS] Cafe\n"
              "GET_ALL_NETWORK_LIST Airport[a.example TLS,a.example TTLS] Cafe\n"
              "\n"
              "GET_ALL_NETWORK_LIST Cafe\n"
              "\n"
              "DETECTED_HOTSPOT; GET_ALL_NETWORK_LIST Airport[a.example TLS,a.example TTLS] Cafe\n");
}

TEST(Air, AnotherBssOfAKnownNameIsNoGrowthButBringsItsRealms) {
    const Ending ending =
        runStory(2, air({network(1, "Airport", realms("a.example", "13"))}), [](World& world) {
            settle(world);
            return walk(world, {R"({"do":"addNetwork","network":)" +
                                    network(2, "Airport", realms("a.example;b.example", "13,21")) + "}",
                                kReport, on("hide", 1), kReport});
        });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text,
              "\nGET_ALL_NETWORK_LIST Airport[a.example TLS,a.example TTLS,b.example TLS,b.example TTLS]\n"
              "\nGET_ALL_NETWORK_LIST Airport[a.example TLS,a.example TTLS,b.example TLS,b.example TTLS]\n");
}

TEST(Air, WithTheFunctionOffNothingIsAnnouncedAndTheListIsNull) {
    const Ending ending = runStory(3, "{}", [](World& world) {
        settle(world);
        world.hotspot().send("SET_HOTSPOT_AUTO_CONNECT", "false");
        world.advance(0ms);
        std::string text = heard(world) + "\n";
        text += walk(world, {R"({"do":"addNetwork","network":)" + network(1, "Airport") + "}", kReport});
        world.hotspot().send("SET_HOTSPOT_AUTO_CONNECT", "true");
        world.advance(0ms);
        return text + heard(world);
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text,
              "GET_ALL_NETWORK_LIST null; SET_HOTSPOT_AUTO_CONNECT\n"
              "\nGET_ALL_NETWORK_LIST null\n"
              "GET_ALL_NETWORK_LIST Airport; SET_HOTSPOT_AUTO_CONNECT");
}

TEST(Air, SettingTheSwitchToWhatItIsBringsTheReplyAlone) {
    const Ending ending = runStory(3, air({network(1, "Airport")}), [](World& world) {
        settle(world);
        world.hotspot().send("SET_HOTSPOT_AUTO_CONNECT", "true");
        world.advance(0ms);
        const auto events = world.hotspot().events();
        return std::to_string(events.size()) + " " + events.at(0).id + " " + events.at(0).dataText;
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "1 SET_HOTSPOT_AUTO_CONNECT true\n");
}

TEST(Air, TheListFollowsTheOrderOfTheReportAndKnownNetworksKeepTheirNamesAndRealms) {
    const Block first = bssRecord("02aa00000001", "Airport");
    const Block second = bssRecord("02aa00000002", "Cafe");
    const Block renamed = bssRecord("02aa00000001", "Harbour");
    const Block moved = bssRecord("02aa00000003", "Airport");
    const Ending ending = runStory(
        4, air({network(1, "Airport", realms("a.example", "13")), network(2, "Cafe")}), [&](World& world) {
            settle(world);
            return walk(world, {moduleMessage(2, second + first), moduleMessage(2, renamed),
                                on("setNetwork", 1, R"("naiRealmHex":"0100")"), moduleMessage(2, renamed),
                                moduleMessage(2, moved + renamed), moduleMessage(2, moved)});
        });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text,
              "GET_ALL_NETWORK_LIST Cafe Airport[a.example TLS]\n"
              "GET_ALL_NETWORK_LIST Airport[a.example TLS]\n"
              "\n"
              "GET_ALL_NETWORK_LIST Airport[a.example TLS]\n"
              "GET_ALL_NETWORK_LIST Airport[a.example TLS]\n"
              "GET_ALL_NETWORK_LIST Airport\n");
}

TEST(Air, ANetworkThatWasHiddenComesBackWithoutWhatWasKnownOfIt) {
    const Ending ending = runStory(
        5, air({network(1, "Airport", realms("a.example", "13")), network(2, "Cafe")}), [](World& world) {
            settle(world);
            return walk(world, {on("hide", 1), kReport, on("setNetwork", 1, R"("anqp":"never")"),
                                on("show", 1), kReport});
        });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text,
              "\nGET_ALL_NETWORK_LIST Cafe\n"
              "\n\nDETECTED_HOTSPOT; GET_ALL_NETWORK_LIST Airport Cafe\n");
}

TEST(Air, RealmDataThatCanNotBeReadCountsAsFetchedAndLeavesTheRealms) {
    const Ending ending =
        runStory(6, air({network(1, "Airport", realms("a.example", "13"))}), [](World& world) {
            settle(world);
            return walk(world, {on("setNetwork", 1, R"("naiRealmHex":"ff")"), kReport,
                                on("setNetwork", 1, R"("naiRealmHex":"0100050000016100ff")"), kReport,
                                on("setNetwork", 1, R"("realms":[])"), kReport,
                                on("setNetwork", 1, R"("naiRealmHex":"")"), kReport,
                                on("setNetwork", 1, realms("sim.example", "18")), kReport});
        });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text,
              "\nGET_ALL_NETWORK_LIST Airport[a.example TLS]\n"
              "\nGET_ALL_NETWORK_LIST Airport[]\n"
              "\nGET_ALL_NETWORK_LIST Airport[]\n"
              "\nGET_ALL_NETWORK_LIST Airport[]\n"
              "\nGET_ALL_NETWORK_LIST Airport[]\n");
}

TEST(Air, ARadioThatGoesOffSendsTheNullListAndOneThatComesBackTheListAgain) {
    const Ending ending = runStory(7, air({network(1, "Airport")}), [](World& world) {
        settle(world);
        std::string text = walk(world, {R"({"do":"radio","software":"off"})", kReport});
        text += askedList(world) + "\n";
        return text + walk(world, {R"({"do":"radio","software":"on"})"});
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text,
              "GET_RADIO; GET_ALL_NETWORK_LIST null\n"
              "GET_ALL_NETWORK_LIST null\n"
              "null\n"
              "GET_RADIO; GET_ALL_NETWORK_LIST Airport\n");
}

TEST(Air, WithoutAnAdapterTheListIsNotEvenNull) {
    const Ending ending = runStory(8, air({network(1, "Airport")}), [](World& world) {
        settle(world);
        world.perform(R"({"do":"pullAdapter"})");
        std::string text = askedList(world);
        world.hotspot().send("GET_IS_INTERNET_ACCESS");
        world.hotspot().send("SET_HOTSPOT_AUTO_CONNECT", "false");
        world.advance(0ms);
        return text + "; " + heard(world);
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "nothing; SET_HOTSPOT_AUTO_CONNECT");
}

TEST(Air, TheListIsWrittenFieldByField) {
    const Ending ending = runStory(
        9,
        air({network(1, "Airport", R"("networkType":7,"internetAccess":0,)" + realms("a.example", "21")),
             network(2, "Cafe", R"("networkType":4294967295,"internetAccess":5)")}),
        [](World& world) {
            settle(world);
            world.perform(kReport);
            return world.hotspot().events().at(0).dataText;
        });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text,
              "[\n"
              "   {\n"
              "      \"IsConnected\" : false,\n"
              "      \"IsInternetAccess\" : 0,\n"
              "      \"NetWorkName\" : \"Airport\",\n"
              "      \"NetworkType\" : 7,\n"
              "      \"RealmFetched\" : true,\n"
              "      \"SupportRealmList\" : [\n"
              "         {\n"
              "            \"CredentialEapMethod\" : 2,\n"
              "            \"RealmName\" : \"a.example\"\n"
              "         }\n"
              "      ]\n"
              "   },\n"
              "   {\n"
              "      \"IsConnected\" : false,\n"
              "      \"IsInternetAccess\" : 2,\n"
              "      \"NetWorkName\" : \"Cafe\",\n"
              "      \"NetworkType\" : 4294967295,\n"
              "      \"RealmFetched\" : false\n"
              "   }\n"
              "]\n");
}

TEST(Air, NullDataIsTheTextOfNullAndADetectionHoldsNothing) {
    const Ending ending = runStory(10, "{}", [](World& world) {
        settle(world);
        world.hotspot().send("GET_ALL_NETWORK_LIST");
        world.advance(0ms);
        std::string text = world.hotspot().events().at(0).dataText;
        world.perform(R"({"do":"addNetwork","network":)" + network(1, "Airport") + "}");
        world.perform(kReport);
        const ClientEvent event = world.hotspot().events().at(0);
        return text + event.id + " " + event.source + " " + event.dataText;
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "null\nDETECTED_HOTSPOT HotSpot20 null\n");
}

}  // namespace
}  // namespace vexa::test
