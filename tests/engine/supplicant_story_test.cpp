#include <gtest/gtest.h>

#include <random>

#include "connection/Supplicant.h"
#include "connection/SupplicantMgr.h"
#include "engine/StoreStory.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;

int handles(World& world) {
    return world.perform(R"({"query":"handles"})").asInt();
}

const GUID kFirst = {0x6B1E8A4C, 0x5D2F, 0x4E0B, {0x9C, 0x37, 0x1F, 0x5D, 0x00, 0x00, 0x00, 0x01}};
const GUID kSecond = {0x6B1E8A4C, 0x5D2F, 0x4E0B, {0x9C, 0x37, 0x1F, 0x5D, 0x00, 0x00, 0x00, 0x02}};

std::string stateOf(const GUID& guid) {
    const auto supplicant = SupplicantMgr::instance().findSupplicantByGuid(guid);
    return !supplicant ? "none" : supplicant->isInitialized() ? "initialised" : "not initialised";
}

TEST(SupplicantStory, ComesAndGoesWithTheAdapterAndLeavesNoHandle) {
    const Ending ending = runStory(1, "{}", [](World& world) {
        std::string told = stateOf(kFirst);
        const int before = handles(world);
        for (int round = 0; round < 3; ++round) {
            world.perform(R"({"do":"pullAdapter"})");
            told += ", " + stateOf(kFirst) + " " + std::to_string(handles(world) - before);
            world.perform(R"({"do":"insertAdapter"})");
            told += ", " + stateOf(kFirst) + " " + std::to_string(handles(world) - before);
        }
        return told;
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text,
              "initialised, none -1, initialised 0, none -1, initialised 0, none -1, initialised 0");
}

TEST(SupplicantStory, AnAdapterIsKnownHoweverItsIdentifierIsWritten) {
    const char* const scenario = R"({"adapters":[{"guid":"{6b1e8a4c-5d2f-4e0b-9c37-1f5d00000001}"}]})";
    const Ending ending = runStory(7, scenario, [](World&) { return stateOf(kFirst); });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "initialised");
}

TEST(SupplicantStory, ASecondArrivalResetsIt) {
    const Ending ending = runStory(1, "{}", [](World& world) {
        const auto before = SupplicantMgr::instance().findSupplicantByGuid(kFirst);
        const int open = handles(world);
        world.perform(R"({"do":"roam"})");
        before->onRoamingStart();
        world.perform(R"({"do":"insertAdapter"})");
        std::string told =
            before == SupplicantMgr::instance().findSupplicantByGuid(kFirst) ? "kept " : "new ";
        before->onRoamingEnd();
        told += count(world.log(), "Received wlan roaming ended event while not received");
        told += std::to_string(handles(world) - open) + " ";
        return told + count(world.log(), "Supplicant with GUID already exists, skip adding.") +
               count(world.log(), "Going to reset the existed supplicant...");
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "kept 1 0 1 1 ");
}

TEST(SupplicantStory, ARemovalWhileAnotherAdapterIsThereRemovesNothing) {
    const Ending ending = runStory(1, R"({"adapters":[{},{}]})", [](World& world) {
        world.perform(R"({"do":"pullAdapter","adapter":1})");
        std::string told = stateOf(kFirst) + " " + count(world.log(), "\tInterface card still inserted");
        world.perform(R"({"do":"pullAdapter","adapter":0})");
        told += stateOf(kFirst) + " ";
        world.perform(R"({"do":"notify","source":8,"code":14})");
        return told + count(world.log(), "\tNo supplicant, do nothing.");
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "initialised 1 none 1 ");
}

TEST(SupplicantStory, ASecondAdapterTakesOverWhenItArrives) {
    const Ending ending = runStory(1, R"({"adapters":[{},{"inserted":false}]})", [](World& world) {
        world.perform(R"({"do":"pullAdapter","adapter":0})");
        world.perform(R"({"do":"insertAdapter","adapter":1})");
        return stateOf(kFirst) + ", " + stateOf(kSecond) + ", " +
               list(world, "ADD_CREDENTIAL", ttlsData("a.example"));
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "none, initialised, CARD_PLUG_OUT CARD_PLUG_IN 1 a.example\n");
}

// What goes wrong while the adapter comes back, how the object stands afterwards, and how many handles are
// open compared with before.
TEST(SupplicantStory, AnInitThatFailsIsTriedOnceMoreAndLeaksNothing) {
    struct Case {
        const char* fault;
        const char* outcome;
    };
    const Case cases[] = {
        {R"({"do":"fail","call":"GetAdaptersAddresses","error":8,"times":1})", "initialised 0 1 1"},
        {R"({"do":"fail","call":"GetAdaptersAddresses","error":8,"times":2})", "not initialised -1 2 2"},
        {R"({"do":"fail","call":"GetAdaptersAddresses","error":111,"times":2})", "initialised 0 0 0"},
        {R"({"do":"fail","call":"GetAdaptersAddresses","error":111,"times":3})", "initialised 0 1 1"},
        {R"({"do":"fail","call":"GetAdaptersAddresses","error":111,"times":5})", "initialised 0 1 1"},
        {R"({"do":"fail","call":"GetAdaptersAddresses","error":111,"times":6})", "not initialised -1 2 2"},
        {R"({"do":"fail","call":"WlanQueryInterface","error":6,"times":2})", "initialised 0 0 0"},
    };
    for (const Case& c : cases) {
        const Ending ending = runStory(1, "{}", [&](World& world) {
            const int before = handles(world);
            world.perform(R"({"do":"pullAdapter"})");
            world.perform(c.fault);
            world.perform(R"({"do":"insertAdapter"})");
            const std::string log = world.log();
            const std::string told = stateOf(kFirst) + " " + std::to_string(handles(world) - before) + " " +
                                     count(log, "Call to GetAdaptersAddresses failed with error: ") +
                                     count(log, "ERROR: Initiailize supplicant failed.");
            return told.substr(0, told.size() - 1);
        });
        EXPECT_TRUE(ending.isOrderly) << ending.errors;
        EXPECT_EQ(ending.text, c.outcome) << c.fault;
    }
}

TEST(SupplicantStory, AnUnlistedAdapterGivesOneThatIsNotInitialisedButServesItsCommands) {
    const Ending ending = runStory(1, R"({"adapters":[{"listed":false}]})", [](World& world) {
        const std::string told = stateOf(kFirst) + " " + list(world, "ADD_CREDENTIAL", ttlsData("a.example"));
        return told + count(world.log(), "!!!Cannot query interface mac address.");
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "not initialised 1 a.example\n2 ");
}

TEST(SupplicantStory, LookupsKeepTheirObjectAlive) {
    const Ending ending = runStory(1, "{}", [](World& world) {
        const auto kept = SupplicantMgr::instance().findSupplicantByGuid(kFirst);
        world.perform(R"({"do":"pullAdapter"})");
        std::string told = stateOf(kFirst) + (kept->isInitialized() ? " alive " : " at rest ");
        const WLAN_PHY_RADIO_STATE off{0, dot11_radio_state_off, dot11_radio_state_off};
        kept->onRadioStateChanged(&off);
        return told + std::to_string(static_cast<int>(SupplicantMgr::instance().removeSupplicant(*kept)));
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "none at rest 2");
}

// The adapter comes and goes between and within the commands. Whatever the order of threads, what the client
// saw last is what the file holds.
TEST(SupplicantStory, AnAdapterPulledInTheMiddleOfACommandHarmsNothing) {
    for (std::uint64_t seed = 1; seed <= 25; ++seed) {
        const Ending ending = runStory(seed, "{}", [seed](World& world) {
            std::mt19937_64 random(seed);
            for (int step = 0; step < 20; ++step) {
                const std::string id = std::to_string(random() % 8);
                switch (random() % 4) {
                    case 0:
                        world.hotspot().send("DELETE_CREDENTIAL", R"({"Id":)" + id + "}");
                        break;
                    case 1:
                        world.hotspot().send("SET_POSITION_CREDENTIAL", R"({"Order":0,"Id":)" + id + "}");
                        break;
                    case 2:
                        world.hotspot().send("READ_CREDENTIAL_FROM_FILE");
                        break;
                    default:
                        world.hotspot().send("ADD_CREDENTIAL", ttlsData("realm" + std::to_string(step)));
                }
                if (random() % 3 == 0) world.perform(R"({"do":"pullAdapter"})");
                if (random() % 3 == 0) world.perform(R"({"do":"insertAdapter"})");
            }
            world.perform(R"({"do":"insertAdapter"})");
            world.advance(0ms);
            world.hotspot().events();
            const std::string seen = list(world, "GET_ALL_CREDENTIAL_LIST");
            world.hotspot().send("READ_CREDENTIAL_FROM_FILE");
            const std::string stored = list(world, "GET_ALL_CREDENTIAL_LIST");
            return seen == stored ? "same" : seen + stored;
        });
        ASSERT_TRUE(ending.isOrderly) << "seed " << seed << "\n" << ending.errors;
        ASSERT_EQ(ending.text, "same") << "seed " << seed;
    }
}

}  // namespace
}  // namespace vexa::test
