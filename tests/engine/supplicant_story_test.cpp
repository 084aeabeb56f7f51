#include <gtest/gtest.h>

#include <random>

#include "connection/Supplicant.h"
#include "connection/SupplicantMgr.h"
#include "engine/world/ConnectStory.h"
#include "platform/Thread.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;

constexpr GUID kFirst = {0x6B1E8A4C, 0x5D2F, 0x4E0B, {0x9C, 0x37, 0x1F, 0x5D, 0x00, 0x00, 0x00, 0x01}};
constexpr GUID kSecond = {0x6B1E8A4C, 0x5D2F, 0x4E0B, {0x9C, 0x37, 0x1F, 0x5D, 0x00, 0x00, 0x00, 0x02}};

std::shared_ptr<Supplicant> supplicantOf(const GUID& guid) {
    return SupplicantMgr::instance().findSupplicantByGuid(guid);
}

void expectState(Story& story, const std::string& wanted, const GUID& guid = kFirst) {
    const auto supplicant = supplicantOf(guid);
    const std::string state = supplicant && supplicant->isInitialized() ? "initialised" : "not initialised";
    story.expect("supplicant", supplicant ? state : "none", wanted);
}

int handles(Story& story) {
    return story.perform(R"({"query":"handles"})").asInt();
}

STORY(SupplicantStory, ComesAndGoesWithTheAdapterAndLeavesNoHandle, "{}") {
    expectState(story, "initialised");
    const int before = handles(story);
    for (int round = 0; round < 3; ++round) {
        story.act("pullAdapter");
        expectState(story, "none");
        story.expect("handles", handles(story), before - 1);
        story.act("insertAdapter");
        expectState(story, "initialised");
        story.expect("handles", handles(story), before);
    }
}

STORY(SupplicantStory, ARemovalIsToldWhileTheConnectingThreadStillSleeps, "{}") {
    platform::Thread pull;
    pull.start("pull", [&] { story.act("pullAdapter"); });
    story.advance(1s);
    for (Client* client : {&story.spectral(), &story.hotspot()}) {
        const auto events = client->events();
        story.expect("heard", events.empty() ? "" : events.back().id, "CARD_PLUG_OUT");
    }
    story.expect("still there", supplicantOf(kFirst) != nullptr, true);
    pull.join(30s);
    expectState(story, "none");
}

STORY(SupplicantStory, AnAdapterIsKnownHoweverItsIdentifierIsWritten,
      R"({"adapters":[{"guid":"{6b1e8a4c-5d2f-4e0b-9c37-1f5d00000001}"}]})") {
    expectState(story, "initialised");
}

STORY(SupplicantStory, ASecondArrivalResetsIt, "{}") {
    const auto supplicant = supplicantOf(kFirst);
    const int before = handles(story);
    supplicant->onRoamingStart();
    story.act("insertAdapter");
    story.expect("the same object", supplicant == supplicantOf(kFirst), true);
    supplicant->onRoamingEnd();
    story.expect("handles", handles(story), before);
    story.expectLog("Supplicant with GUID already exists, skip adding.",
                    "Going to reset the existed supplicant...",
                    "Received wlan roaming ended event while not received wlan roaming not started event.");
}

STORY(SupplicantStory, ARemovalWhileAnotherAdapterIsThereRemovesNothing, R"({"adapters":[{},{}]})") {
    story.act("pullAdapter", R"("adapter":1)");
    expectState(story, "initialised");
    story.expectLog("\tInterface card still inserted, don't remove supplicant.");
    story.act("pullAdapter", R"("adapter":0)");
    expectState(story, "none");
    story.act("notify", R"("source":8,"code":14)");
    story.expectLog("\tNo supplicant, do nothing.");
}

STORY(SupplicantStory, ASecondAdapterTakesOverWhenItArrives, R"({"adapters":[{},{"inserted":false}]})") {
    story.play({doing("pullAdapter", R"("adapter":0)"), doing("insertAdapter", R"("adapter":1)")});
    expectState(story, "none");
    expectState(story, "initialised", kSecond);
    story.expect("heard", list(story, "ADD_CREDENTIAL", ttlsData("a.example")),
                 "CARD_PLUG_OUT CARD_PLUG_IN 1 a.example");
}

// What goes wrong so many times while the adapter comes back, and what the log has of it.
void failsToInit(const char* call, int error, int times, const char* state, int moreHandles, int lines) {
    const std::string failure = failing(call, error, R"("times":)" + std::to_string(times));
    EXPECT_STORY("{}", [&](Story& story) {
        const int before = handles(story);
        story.play({doing("pullAdapter"), failure, doing("insertAdapter")});
        expectState(story, state);
        story.expect("handles", handles(story), before + moreHandles);
        for (const char* const line :
             {"Call to GetAdaptersAddresses failed with error: ", "ERROR: Initiailize supplicant failed."})
            story.expectOfLog(line, count(story.messages(), line), lines);
    }) << failure;
}

TEST(SupplicantStory, AnInitThatFailsIsTriedOnceMoreAndLeaksNothing) {
    failsToInit("GetAdaptersAddresses", 8, 1, "initialised", 0, 1);
    failsToInit("GetAdaptersAddresses", 8, 2, "not initialised", -1, 2);
    failsToInit("GetAdaptersAddresses", 111, 2, "initialised", 0, 0);
    failsToInit("GetAdaptersAddresses", 111, 3, "initialised", 0, 1);
    failsToInit("GetAdaptersAddresses", 111, 5, "initialised", 0, 1);
    failsToInit("GetAdaptersAddresses", 111, 6, "not initialised", -1, 2);
    failsToInit("WlanQueryInterface", 6, 2, "initialised", 0, 0);
}

STORY(SupplicantStory, AnUnlistedAdapterGivesOneThatIsNotInitialisedButServesItsCommands,
      R"({"adapters":[{"listed":false}]})") {
    expectState(story, "not initialised");
    story.expect("list", list(story, "ADD_CREDENTIAL", ttlsData("a.example")), "1 a.example");
    story.expectOfLog("lines", count(story.messages(), "!!!Cannot query interface mac address."), 2);
}

STORY(SupplicantStory, LookupsKeepTheirObjectAlive, "{}") {
    const auto kept = supplicantOf(kFirst);
    story.act("pullAdapter");
    expectState(story, "none");
    story.expect("the one that is kept", kept->isInitialized(), false);
    const WLAN_PHY_RADIO_STATE off{0, dot11_radio_state_off, dot11_radio_state_off};
    kept->onRadioStateChanged(&off);
    story.expect("removing it again", SupplicantMgr::instance().removeSupplicant(*kept) == kNotFound, true);
}

// Neither the hotspot module nor the file brings these yet.
STORY(SupplicantStory, TheHomeNetworkGoesFirstAndARoamingConsortiumIsLeftAlone,
      air({open(1, "first", ttls()), open(2, "home", ttls("b.example"))},
          storing({{}, {.id = 2, .realm = "b.example"}}) + R"(,"session":"disconnected")")) {
    {
        const platform::LockGuard lock(g_hs20Lock);
        const auto supplicant = supplicantOf(kFirst);
        const auto networks = supplicant->networks().copyPointers();
        CredentialTable& table = SupplicantMgr::instance().config().credentials();
        Credential now = *table.copyCredentialPointers().at(0);
        now.m_homeSpFqdn = now.m_roamingConsortium = L"ab";
        table.replace(*table.copyCredentialPointers().at(0), now);
        networks.at(0)->m_anqpRoamingConsortium = bytesOfHex("026162");
        networks.at(1)->m_anqpDomainName = bytesOfHex("026162");
    }
    story.play({doing("setSession", R"("session":"active")"), passing(6s), connecting("first"), passing(5s)});
    expectStanding(story, {"home ttls u2", "1 access", "home"});
    story.play({on("setNetwork", 2, R"("reported":false)"), kReport, on("hide", 2), passing(60s)});
    expectStanding(story, {"home ttls u2", "", "-"});
}

// The adapter comes and goes between and within the commands. Whatever the order of threads, what the client
// saw last is what the file holds.
TEST(SupplicantStory, AnAdapterPulledInTheMiddleOfACommandHarmsNothing) {
    for (std::uint64_t seed = 1; seed <= 25; ++seed)
        EXPECT_STORY({.seed = seed}, "{}", [seed](Story& story) {
            std::mt19937_64 random(seed);
            for (int step = 0; step < 20; ++step) {
                const std::string id = R"("Id":)" + std::to_string(random() % 8) + "}";
                const std::pair<const char*, std::string> commands[] = {
                    {"DELETE_CREDENTIAL", "{" + id},
                    {"SET_POSITION_CREDENTIAL", R"({"Order":0,)" + id},
                    {"READ_CREDENTIAL_FROM_FILE", ""},
                    {"ADD_CREDENTIAL", ttlsData("realm" + std::to_string(step))}};
                const auto& [command, data] = commands[random() % 4];
                story.hotspot().send(command, data);
                if (random() % 3 == 0) story.act("pullAdapter");
                if (random() % 3 == 0) story.act("insertAdapter");
            }
            story.play({doing("insertAdapter"), passing(0ms)});
            story.hotspot().events();
            const std::string seen = list(story);
            story.hotspot().send("READ_CREDENTIAL_FROM_FILE");
            story.expect("list as the file has it", list(story), seen);
        });
}

}  // namespace
}  // namespace vexa::test
