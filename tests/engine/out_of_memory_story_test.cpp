#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>
#include <functional>
#include <pugixml.hpp>

#include "engine/world/ConnectStory.h"
#include "platform/seeded/Scheduler.h"
#include "simulation/parts/MachineCode.h"
#include "unit/platform/ShortMemory.h"

extern "C" __attribute__((weak)) int __lsan_do_recoverable_leak_check();

namespace vexa::test {
namespace {

using namespace std::chrono_literals;

using Deed = std::function<void(Story&)>;
using Look = std::function<std::string(Story&)>;

constexpr const char* kNotifications = "wlan notifications";
constexpr const char* kCommands = "dispatcher";

struct Shortage {
    const char* name;
    const char* thread;
    Deed prepare;
    Deed deed;  // while memory is short, and once more behind it
    Look look;
    bool log = false;
};

void PrintTo(const Shortage& shortage, std::ostream* out) {
    *out << shortage.name;
}

Deed playing(const std::vector<std::string>& deeds) {
    return [deeds](Story& story) { story.play(deeds); };
}

/// What the client sees of networks, credentials and the connection.
std::string sight(World& world) {
    const std::string networks = askedList(world);
    return networks + "; " + list(world) + "; " + connectedTo(world);
}

/// The noise on the channels, as far as the client was told.
std::string noise(World& world) {
    static std::string known;
    for (const ClientEvent& event : world.spectral().events())
        if (event.id.ends_with("INTERFERENCE")) known = compact(event.data);
    return known;
}

std::string spectralAnswers(World& world) {
    std::string text;
    for (const ClientEvent& event : world.spectral().events())
        text += event.id + " ";
    return text;
}

Deed asking(const std::vector<std::string>& commands) {
    return [commands](Story& story) {
        for (const std::string& command : commands)
            story.spectral().send(command);
        story.advance(1s);
    };
}

/// A message of the spectral module: one sample of channel 1.
std::string sample(std::int16_t power) {
    Block bytes = bytesOfHex("005ec406 00000000 01000000 325c0000 0100") + Block(236);
    const std::span record = std::span(bytes).subspan(18);
    writeLittleEndian<std::uint16_t>(record, 0, 2412);
    writeLittleEndian<std::int16_t>(record, 7, power);
    std::fill_n(record.begin() + 56, 56, std::byte{1});
    return doing("ihv", R"("dataHex":")" + hexOf(bytes) + "\"");
}

const char* g_thread = nullptr;

bool isWatched() {
    const platform::Task* const task = platform::Scheduler::current();
    return task != nullptr && task->name == g_thread && !simulation::MachineCode::isRunning();
}

bool isShortDuring(Story& story, const Deed& deed, int granted, bool lasts) {
    const ShortMemory memory(isWatched, granted, lasts);
    deed(story);
    return memory.hasRefused();
}

/// Every request for memory of a deed is refused once, alone or with all that follow: the service lives on,
/// and the same deed then does what it always does.
void expectSurvival(Story& story, const Shortage& shortage) {
    const auto outcome = [&] {
        shortage.look(story);
        std::filesystem::remove(story.logFile());
        story.forget();
        shortage.deed(story);
        return shortage.look(story);
    };
    g_thread = shortage.thread;
    shortage.prepare(story);
    const std::string wanted = outcome();
    int refused = 0;
    for (const bool lasts : {false, true}) {
        bool isShort = true;
        for (int granted = 0; isShort && story.differences().empty(); granted += lasts ? 5 : 1) {
            shortage.prepare(story);
            isShort = isShortDuring(story, shortage.deed, granted, lasts);
            refused += isShort ? 1 : 0;
            story.about(std::to_string(granted));
            story.expect("the outcome", outcome(), wanted);
        }
    }
    story.expect("something is refused", refused > 1, true);
    if (__lsan_do_recoverable_leak_check != nullptr)
        story.expect("leaks", __lsan_do_recoverable_leak_check(), 0);
}

const std::string kLongName = "a name of as many as 32 bytes...";
const std::string kAir =
    air({network(1, "Airport", tls("b.example")), network(2, "Airport", both("b.example;c.example")),
         network(3, kLongName, both() + "," + lettingIn(R"({"eapMethod":21,"username":"u2"})"))},
        storing({{.id = 1, .isTls = true}, {.id = 2}}) +
            R"(,"connectMs":10,"anqpMs":10,"spectrum":{"channels":[1,36]})");
const std::string kCompleted = doing("ihv", R"("dataHex":"005ec4060000000002000000325c0000")");
const std::string kOther =
    moduleMessage(2, bssRecord("02aa00000009", "old") + bssRecord("02aa00000003", kLongName));
const Deed kNothing = playing({});
const Deed kJoining = playing({connecting(kLongName), passing(2s)});
const Deed kLeaving = playing({disconnecting(kLongName), passing(1s)});
const std::string kHome = R"(,"profileName":"home","ssidHex":"686f6d65")";
const std::string kSaving = sending("SET_POSITION_CREDENTIAL", R"({"Id":1,"Order":0})");

Deed editing(const std::string& name) {
    const std::string members = R"("Id":2,"AutoConnect":true,"CredentialName":")" + name + "\"";
    return playing({sending("EDIT_CREDENTIAL", ttlsData("a.example", members))});
}

/// The credentials as they were at first: the next one is the third.
void restore(Story& story) {
    static const std::string first = story.config();
    story.writeConfig(first);
    story.order("READ_CREDENTIAL_FROM_FILE");
}

void add(Story& story) {
    story.order("ADD_CREDENTIAL", ttlsData("new.example"));
}

int g_addedId = 0;

void restoreAndAdd(Story& story) {
    restore(story);
    add(story);
    g_addedId = std::stoi(list(story));
}

void deleteAdded(Story& story) {
    story.order("DELETE_CREDENTIAL", R"({"Id":)" + std::to_string(g_addedId) + "}");
}

/// How often this stands in the list, and in the file once it is saved again.
Look counting(const std::string& text) {
    return [text](World& world) {
        world.play({kSaving});
        const std::string listed = list(world);
        return std::to_string(count(listed, text)) + " " + std::to_string(count(world.config(), text));
    };
}

const Shortage kShortages[] = {
    {"List", kNotifications, playing({kOther}), playing({kReport}), askedList, true},
    {"Realms", kNotifications, kNothing, playing({sending("UPDATE_NETWORK_REALM"), passing(30s)}), sight},
    {"Reports", kNotifications, kNothing,
     playing({doing("userDisconnect", R"("ssid":")" + kLongName + "\""),
              doing("sessionChange", R"("eventType":1)"), on("reportAnqp", 3), doing("roam"),
              doing("driverState", R"("current":1,"previous":2)"), doing("connection", R"("code":9)" + kHome),
              doing("connection", R"("code":10)" + kHome)}),
     heard},
    {"Outcome", kNotifications, kLeaving, kJoining, connectedTo},
    {"Radio", kNotifications, kNothing, playing({kRadioOff, passing(1s), kRadioOn, passing(40s)}), sight},
    {"Adapter", kNotifications, kNothing,
     playing({doing("pullAdapter"), passing(1s), doing("insertAdapter"), passing(40s)}), sight},
    {"Pass", kNotifications, playing({sample(30), kCompleted}),
     playing({sample(45), kCompleted, sample(60), kCompleted}), noise},
    {"Watchdog", "spectral timer", playing({sample(30), passing(11s)}),
     playing({sample(45), passing(11s), sample(60), passing(11s)}), noise},
    {"Round", "connecting", playing({kRadioOff, passing(1s)}), playing({kRadioOn, passing(40s)}),
     connectedTo},
    {"Log", "log", kNothing, playing({kReport, passing(25s)}),
     [](World& world) { return std::to_string(count(world.messages(), "IHV reports HS20")); }, true},
    {"Questions", kCommands, kNothing,
     playing({sending("GET_ALL_CREDENTIAL_LIST"), sending("GET_ALL_NETWORK_LIST"), sending("GET_RADIO"),
              sending("GET_IS_CARD_IN"), sending("GET_IS_INTERNET_ACCESS")}),
     heard},
    {"Adding", kCommands, restore, add, counting("new.example")},
    {"Deleting", kCommands, restoreAndAdd, deleteAdded, counting("new.example")},
    {"Editing", kCommands, editing("one"), editing("another"), counting("another")},
    {"Reloading", kCommands, kNothing, playing({sending("READ_CREDENTIAL_FROM_FILE"), kSaving}), sight},
    {"Joining", kCommands, kLeaving, kJoining, connectedTo},
    {"Leaving", kCommands, kJoining, kLeaving, connectedTo},
    {"Switch", kCommands, kNothing, playing({kHs20Off, passing(1s), kHs20On, passing(40s)}), sight},
    {"Spectrum", kCommands, kNothing,
     asking({"FULL_SCAN", "GET_CHANNEL_LIST", "GET_CURRENT_CHANNEL", "STOP_SCAN"}), spectralAnswers},
};

class OutOfMemory : public testing::TestWithParam<Shortage> {};

TEST_P(OutOfMemory, EndsWhatIsDoneAndNotTheService) {
    // XML has an allocator of its own.
    EXPECT_STORY(test::Run{.log = GetParam().log}, kAir, [&](Story& story) {
        pugi::set_memory_management_functions(grantedMemory, std::free);
        asking({"GET_CHANNEL_LIST"})(story);
        settle(story);
        expectSurvival(story, GetParam());
    });
}

// Else samples for which a pass lacks the memory would be in the way of every later one.
TEST(OutOfMemoryOfAPass, ForgetsItsSamples) {
    EXPECT_STORY(test::Run{}, kAir, [](Story& story) {
        asking({"GET_CHANNEL_LIST"})(story);
        story.play({sample(30), kCompleted});
        const std::string told = noise(story);
        story.play({sample(60)});
        g_thread = kNotifications;
        story.expect("the pass fails", isShortDuring(story, playing({kCompleted}), 0, true), true);
        story.play({kCompleted});
        story.expect("the noise", noise(story), told);
    });
}

INSTANTIATE_TEST_SUITE_P(In, OutOfMemory, testing::ValuesIn(kShortages),
                         [](const auto& shortage) { return shortage.param.name; });

}  // namespace
}  // namespace vexa::test
