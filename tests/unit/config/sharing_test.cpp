#include <gtest/gtest.h>

#include <functional>
#include <iterator>
#include <random>
#include <regex>
#include <utility>
#include <vector>

#include "text/TextConversion.h"
#include "unit/config/StoreMachine.h"
#include "unit/hotspot/LogCapture.h"

namespace vexa::test {
namespace {

const std::string kBobs = ttls(2, "b", "PC\\bob", "peruser");

std::string element(const std::string& content) {
    return "<credential>" + content + "</credential>";
}

// The user is PC\alice.
TEST(Sharing, WhatAUserSeesAndWhetherHeMustSave) {
    const std::string three = ttls(1, "a") + ttls(2, "b") + ttls(3, "c");
    const auto alice = [](const std::string& places) { return user("PC\\alice", places); };
    struct Case {
        const char* story;
        std::string credentials;
        std::string users;
        const char* places;
        bool isChanged = false;
    };
    const Case cases[] = {
        {"first read: file order, and nothing to save", three, "", "1:1 2:2 3:3"},
        {"his own order", three, alice("3:1 1:2 2:3"), "3:1 1:2 2:3"},
        {"another's order", three, user("PC\\bob", "3:1 1:2 2:3"), "1:1 2:2 3:3"},
        {"the first of two lists", three, alice("3:1 2:2 1:3") + alice("1:1 2:2 3:3"), "3:1 2:2 1:3"},
        {"names are told apart by case", three, user("pc\\alice", "3:1 1:2 2:3"), "1:1 2:2 3:3"},
        {"another's private one", ttls(1, "a") + kBobs, alice("1:1"), "1:1"},
        {"his own private one", ttls(1, "a", "PC\\alice", "peruser"), "", "1:1"},
        {"a public one of another", ttls(1, "a", "PC\\bob"), "", "1:1"},
        {"one that others added comes first", three, alice("2:1 1:2"), "3:1 2:2 1:3", true},
        {"one that others deleted", ttls(1, "a"), alice("5:1 1:2"), "1:2", true},
        {"a listed one without a place", three, alice("3:1 1:-1 2:2"), "1:1 3:2 2:3"},
        {"a listed one with an empty place", three, alice("2: 1:1 3:2"), "2:1 1:2 3:3"},
        {"place 0 stays before all", three, alice("3:0 1:1 2:2"), "3:0 1:1 2:2"},
        {"place 9999 is none", three, alice("3:9999 1:1 2:2"), "3:1 1:2 2:3"},
        {"references to nothing", three, alice("0:1 -4:2 1:1 2:2 3:3"), "1:1 2:2 3:3"},
        {"a stale reference without a place", three, alice("9:-1 1:1 2:2 3:3"), "1:1 2:2 3:3"},
        {"no list", three, "<user><username>PC\\alice</username></user>", "1:1 2:2 3:3", true},
        {"ids that are none", ttls(0, "a") + ttls(-1, "b") + "<credential/>" + ttls(4, "d"), "", "4:1"},
        {"an unknown type", element("<id>3</id><type>eapsim</type><accesstype>alluser</accesstype>"), "", ""},
        {"an unknown access", ttls(1, "a", "PC\\alice", "everyone"), "", ""},
        {"another name", "<x><id>6</id><type>eaptls</type><accesstype>alluser</accesstype></x>", "", "6:1"},
    };
    for (const Case& c : cases) {
        StoreMachine store;
        bool isChanged = !c.isChanged;
        ASSERT_EQ(store.openWith(document(c.credentials, c.users), &isChanged), kSuccess) << c.story;
        EXPECT_EQ(places(store.config().credentials()), c.places) << c.story;
        EXPECT_EQ(isChanged, c.isChanged) << c.story;
        EXPECT_EQ(store.file(), document(c.credentials, c.users)) << c.story;
    }
}

// What a save of PC\alice leaves of the section of credentials.
TEST(Sharing, WhatASaveKeepsAndWhatItTakesAway) {
    const std::string unnumbered = "<credential><x>y</x></credential>" + ttls(0, "z");
    const std::string nobodys = element("<id>5</id><accesstype>peruser</accesstype>");
    const std::string odd =
        "<credential a=\"1\"><id>7</id><type>eapttls</type><accesstype>peruser</accesstype>"
        "<creator>PC\\bob</creator><x>y</x></credential>";
    const auto sim = [](const std::string& access, const std::string& creator) {
        return element("<id>3</id><type>eapsim</type><accesstype>" + access + "</accesstype><creator>" +
                       creator + "</creator>");
    };
    struct Case {
        const char* story;
        std::string before;
        std::string after;
    };
    const Case cases[] = {
        {"another's private one stays, in front", ttls(1, "a") + kBobs, kBobs + ttls(1, "a")},
        {"another's public one becomes the saver's", ttls(1, "a", "PC\\bob"), ttls(1, "a")},
        {"his own private one stays private", ttls(1, "a", "PC\\alice", "peruser"),
         ttls(1, "a", "PC\\alice", "peruser")},
        {"no id stays", unnumbered + ttls(1, "a"), unnumbered + ttls(1, "a")},
        {"an unknown type that all see goes", sim("alluser", "PC\\bob"), ""},
        {"an unknown type of his own goes", sim("peruser", "PC\\alice"), ""},
        {"an unknown type of another stays", sim("peruser", "PC\\bob"), sim("peruser", "PC\\bob")},
        {"an unknown access goes", ttls(1, "a", "PC\\bob", "everyone"), ""},
        {"a private one of nobody stays", nobodys, nobodys},
        {"what another's holds stays", odd, odd},
        {"what his own holds beyond the known goes",
         element("<id>1</id><type>eaptls</type><accesstype>alluser</accesstype><realm>r</realm><x>y</x>"
                 "<username>u</username><cacert>ca</cacert><clientcert>client</clientcert>"),
         element("<id>1</id><type>eaptls</type><accesstype>alluser</accesstype><creator>PC\\alice</creator>"
                 "<eap>1</eap><autoconnect>true</autoconnect><credname>r</credname><realm>r</realm>"
                 "<cacert>ca</cacert><clientcert>client</clientcert>")},
        {"an outer method without a number",
         element(
             "<id>1</id><type>eapttls</type><accesstype>alluser</accesstype><autoconnect>True</autoconnect>"
             "<credname></credname><realm>r</realm>"),
         element("<id>1</id><type>eapttls</type><accesstype>alluser</accesstype><creator>PC\\alice</creator>"
                 "<eap>0</eap><autoconnect>false</autoconnect><credname>r</credname><realm>r</realm>"
                 "<username></username><password></password>")},
    };
    for (const Case& c : cases) {
        StoreMachine store;
        ASSERT_EQ(store.openWith(document(c.before, "")), kSuccess) << c.story;
        ASSERT_EQ(store.save(), kSuccess) << c.story;
        const std::string list = user("PC\\alice", places(store.config().credentials()));
        EXPECT_EQ(store.file(), saved(c.after, list)) << c.story;
    }
}

TEST(Sharing, ASaveRewritesTheUsersOwnListAlone) {
    StoreMachine store;
    const std::string credentials = ttls(3, "c") + ttls(1, "a");
    const std::string bob = user("PC\\bob", "9:1 1:2");
    const std::string alice = user("PC\\alice", "3:1 1:2");
    const std::string users = alice + bob + user("PC\\alice", "7:1") + "<!-- n --><user><x/></user>";
    ASSERT_EQ(store.openWith(document(credentials, users)), kSuccess);
    ASSERT_EQ(store.save(), kSuccess);
    EXPECT_EQ(store.file(), saved(credentials, bob + "<!-- n --><user><x></x></user>" + alice));
}

TEST(Sharing, AFileThatLacksASectionIsOnlySavedWhereNothingIsLost) {
    StoreMachine store;
    ASSERT_EQ(store.openWith("<c><global/><users/></c>"), kSuccess);
    EXPECT_EQ(store.save(), kSuccess);
    EXPECT_EQ(store.add(L"r"), kFailure);
    EXPECT_EQ(store.file().find("<credentials>"), store.file().rfind("<credentials>")) << "in the list alone";
    store.write("config.xml", "<c><global/><credentials/></c>");
    EXPECT_EQ(store.save(), kFailure);
    EXPECT_EQ(store.file().find("<users>"), std::string::npos);
}

using Deed = std::function<void(StoreMachine&)>;

Deed byHand(const std::string& credentials, const std::string& users, int next) {
    const std::string global =
        "<homerealm>h</homerealm><nextcredid>" + std::to_string(next) + "</nextcredid>";
    return [=](StoreMachine& store) { store.write("config.xml", document(credentials, users, global)); };
}

Deed adding(const std::string& realm) {
    return [=](StoreMachine& store) { store.add(wideFromNarrow(realm)); };
}

Deed editing(int id, const std::string& realm) {
    return [=](StoreMachine& store) {
        store.change([&](CredentialTable& table) {
            const Credential* const edited = table.findCredentialById(id);
            if (edited == nullptr) return;
            Credential now = *edited;
            now.m_realm = wideFromNarrow(realm);
            table.replace(*edited, std::move(now));
        });
    };
}

Deed deleting(int id) {
    return [=](StoreMachine& store) {
        store.change([&](CredentialTable& table) { table.deleteCredential(store.config().currentId(id)); });
    };
}

Deed moving(int id, int place) {
    return [=](StoreMachine& store) {
        store.change([&](CredentialTable& table) { table.setCredentialPosition(id, place); });
    };
}

/// What the deed changes can't be saved.
Deed inVain(const Deed& deed) {
    return [=](StoreMachine& store) {
        store.fail("rename");
        deed(store);
    };
}

const Deed kRemoving = [](StoreMachine& store) { std::filesystem::remove(store.folder() / "config.xml"); };
const Deed kBreaking = [](StoreMachine& store) { store.write("config.xml", "<half"); };
const Deed kReading = [](StoreMachine& store) { EXPECT_EQ(store.config().readConfig(nullptr), kSuccess); };

/// The credentials of a file: "3:c 1:a", by id and realm.
std::string entries(const std::string& file) {
    std::string text;
    const std::regex entry("<id>(\\d+)</id><type>.*?<realm>(.*?)</realm>");
    for (std::sregex_iterator at(file.begin(), file.end(), entry), end; at != end; ++at)
        text += (text.empty() ? "" : " ") + (*at)[1].str() + ":" + (*at)[2].str();
    return text;
}

/// The places of those of them that are not Bob's, "x", one behind the other.
std::string placesOfOwn(const std::string& entries) {
    std::string text;
    int place = 0;
    const std::regex own("(\\d+):[^x ]");
    for (std::sregex_iterator at(entries.begin(), entries.end(), own), end; at != end; ++at)
        text += (text.empty() ? "" : " ") + (*at)[1].str() + ":" + std::to_string(++place);
    return text;
}

// PC\alice's service has two credentials, 1:a and 2:b, when others change the file: another user's service,
// or somebody by hand. Each of her own changes reads it anew.
TEST(Sharing, WhatOthersChangedIsTakenOverAndWhatCouldNotBeSavedStays) {
    const std::string one = ttls(1, "a");
    const std::string both = one + ttls(2, "b");
    const std::string list = user("PC\\alice", "1:1 2:2");
    const auto bobs = [](int id) { return ttls(id, "x", "PC\\bob", "peruser"); };
    const auto writing = [&](const std::string& credentials, int next) {
        return byHand(credentials, credentials.empty() ? "" : list, next);
    };
    const auto listed = [&](const char* order) { return byHand(both, user("PC\\alice", order), 3); };
    struct Case {
        const char* story;
        std::vector<Deed> deeds;
        const char* file;
        int nextId = 4;
    };
    const Case cases[] = {
        {"nobody else", {adding("c")}, "3:c 1:a 2:b"},
        {"another's private one", {writing(bobs(3) + both, 4), adding("c")}, "3:x 4:c 1:a 2:b", 5},
        {"a private one has the same id", {writing(bobs(2) + both, 3), adding("c")}, "2:x 4:c 3:b 1:a", 5},
        {"and is behind", {writing(both + bobs(2), 3), kReading, adding("c")}, "2:x 4:c 3:b 1:a", 5},
        {"an id twice", {writing(both + ttls(2, "y"), 3), adding("c")}, "4:c 3:y 1:a 2:b", 5},
        {"an id twice at a read",
         {writing(both + ttls(2, "y"), 3), kReading, adding("c")},
         "4:c 3:y 1:a 2:b",
         5},
        {"the next id went back", {writing(bobs(7) + both, 1), adding("c")}, "7:x 8:c 1:a 2:b", 9},
        {"or back behind what was given out",
         {adding("c"), deleting(3), writing(both, 1), kReading, adding("d")},
         "4:d 1:a 2:b",
         5},
        {"and is deleted by the id that the client knows",
         {writing(bobs(2) + both, 3), deleting(2)},
         "2:x 1:a"},
        {"one for all was added", {writing(both + ttls(3, "y"), 4), moving(1, 3)}, "3:y 2:b 1:a"},
        {"one was deleted", {writing(ttls(2, "b"), 3), moving(2, 1)}, "2:b", 3},
        {"one was edited", {writing(one + ttls(2, "y"), 3), moving(2, 1)}, "2:y 1:a", 3},
        {"the order was changed", {listed("2:1 1:2"), adding("c")}, "3:c 2:b 1:a"},
        {"the order was changed back",
         {moving(1, 1), moving(2, 1), listed("1:1 2:2"), adding("c")},
         "3:c 1:a 2:b"},
        {"unsaved: an addition", {inVain(adding("c")), adding("d")}, "4:d 3:c 1:a 2:b", 5},
        {"unsaved: an addition, its id given to another",
         {inVain(adding("c")), writing(both + ttls(3, "y"), 4), moving(1, 1)},
         "1:a 3:y 4:c 2:b",
         5},
        {"unsaved: an addition, its id given to Bob",
         {inVain(adding("c")), writing(bobs(3) + both, 4), moving(2, 1)},
         "3:x 2:b 4:c 1:a",
         5},
        {"unsaved: an addition, its id given away, deleted",
         {inVain(adding("c")), writing(both + ttls(3, "y"), 4), deleting(3)},
         "3:y 1:a 2:b",
         5},
        {"unsaved: an addition, its id and realm Bob's",
         {inVain(adding("c")), writing(both + ttls(3, "c", "PC\\bob"), 4), moving(1, 1)},
         "1:a 3:c 4:c 2:b",
         5},
        {"unsaved: an edit", {inVain(editing(2, "z")), writing(both, 3), moving(2, 1)}, "2:z 1:a", 3},
        {"unsaved: an edit of what was edited",
         {inVain(editing(2, "z")), writing(one + ttls(2, "y"), 3), moving(2, 1)},
         "2:z 1:a",
         3},
        {"unsaved: an edit of what was deleted",
         {inVain(editing(2, "z")), writing(one, 3), moving(2, 1)},
         "2:z 1:a",
         3},
        {"unsaved: a deletion",
         {inVain(deleting(2)), writing(one + ttls(2, "y"), 3), adding("c")},
         "3:c 1:a"},
        {"unsaved: one; another was deleted",
         {inVain(adding("c")), writing(one, 3), moving(1, 1)},
         "1:a 3:c"},
        {"unsaved: a move", {inVain(moving(2, 1)), listed("1:5 2:6"), adding("c")}, "3:c 2:b 1:a"},
        {"unsaved, and read anew by command", {inVain(adding("c")), kReading, adding("d")}, "4:d 1:a 2:b", 5},
        {"broken for a while", {kBreaking, adding("c"), writing(both, 3), adding("d")}, "4:d 3:c 1:a 2:b", 5},
        {"removed, and made by another",
         {kRemoving, adding("c"), writing("", 1), adding("d")},
         "4:d 3:c 1:a 2:b",
         5},
        {"removed, and made by another before anything else",
         {kRemoving, writing("", 1), adding("d")},
         "3:d 1:a 2:b"},
        {"removed, and an old one brought back",
         {kRemoving, deleting(2), writing(ttls(1, "a") + bobs(2), 3), adding("c")},
         "2:x 3:c 1:a"},
    };
    for (const Case& c : cases) {
        StoreMachine store;
        ASSERT_EQ(store.openWith(document(both, list, "<nextcredid>3</nextcredid>")), kSuccess);
        for (const Deed& deed : c.deeds)
            deed(store);
        EXPECT_EQ(entries(store.file()), c.file) << c.story;
        EXPECT_EQ(places(store.config().credentials()), placesOfOwn(c.file)) << c.story;
        EXPECT_EQ(store.config().nextCredId(), c.nextId) << c.story;
        const std::string next = "<nextcredid>" + std::to_string(c.nextId) + "</nextcredid>";
        EXPECT_NE(store.file().find(next), std::string::npos) << c.story;
        bool isChanged = true;
        const std::string settled = store.file();
        Config reader;
        ASSERT_EQ(open(reader, &isChanged), kSuccess);
        EXPECT_FALSE(isChanged) << c.story << settled;
    }
}

/// A change of the kind that the number tells, of or beside the credential with this id.
void changeAtRandom(Config& config, unsigned kind, std::int32_t id, const std::wstring& text) {
    const auto held = config.beginChange();
    CredentialTable& table = config.credentials();
    const Credential* const one = table.findCredentialById(config.currentId(id));
    CredentialInput input;
    input.type = kind % 2 == 0 ? CRED_TYPE_EAP_TTLS : CRED_TYPE_EAP_TLS;
    input.realm = input.username = input.caCert = text;
    std::int32_t added = 0;
    if (kind < 3 && table.addCredential(input, config.nextCredId(), config.userName(), added) == kSuccess)
        config.advanceNextCredId();
    if (kind == 3 && one != nullptr) {
        Credential now = *one;
        if (!text.empty() && id % 3 == 0) now.m_credName = now.m_realm = text;
        if (id % 3 == 1) now.m_password = text;
        if (id % 3 == 2) now.m_bAutoConnect = !now.m_bAutoConnect;
        table.replace(*one, std::move(now));
    }
    if (kind == 4) table.deleteCredential(config.currentId(id));
    if (kind == 5) table.setCredentialPosition(config.currentId(id), id);
    config.saveConfig(held);
}

// What a service knows of the file that it saved itself is what one that has just started reads there.
TEST(Sharing, AServiceOfLongStandingSavesWhatOneThatJustStartedSaves) {
    const std::wstring texts[] = {L"a",       L"", L"<b>&c;]]>", L"\r\n d\t", L"\u00e4\u20ac\U0001F600",
                                  L"'\"&#13;"};
    for (unsigned seed = 1; seed <= 8; ++seed) {
        std::mt19937 random(seed);
        StoreMachine store;
        const std::string others = ttls(2, "x", "PC\\bob", "peruser") + element("<id>0</id>") + ttls(1, "a");
        ASSERT_EQ(store.openWith(document(others, user("PC\\bob", "2:1"))), kSuccess);
        std::vector<std::function<void(Config&)>> unsaved;
        for (int step = 0; step < 40; ++step) {
            const bool isInVain = random() % 8 == 0;
            if (isInVain) store.fail("rename");
            if (random() % 8 == 0) store.write("config.xml", store.file() + "<!-- by hand -->");
            const std::string before = store.file();
            unsaved.push_back([kind = static_cast<unsigned>(random() % 6),
                               id = static_cast<std::int32_t>(random() % 16),
                               text = texts[random() % std::size(texts)]](Config& config) {
                changeAtRandom(config, kind, id, text);
            });
            unsaved.back()(store.config());
            if (isInVain) continue;
            const std::string after = store.file();
            store.write("config.xml", before);
            Config fresh;
            ASSERT_EQ(open(fresh), kSuccess);
            for (const auto& change : std::exchange(unsaved, {}))
                change(fresh);
            ASSERT_EQ(store.file(), after) << "seed " << seed << ", step " << step;
        }
    }
}

// The lock's holder hangs in the middle of his save.
TEST(Sharing, WithoutTheLockNothingIsWrittenAndNothingIsLost) {
    StoreMachine store;
    const std::string before = document(ttls(1, "a"), "");
    ASSERT_EQ(store.openWith(before), kSuccess);
    auto other = store.config().lockFile();
    EXPECT_EQ(store.add(L"b"), kFailure);
    EXPECT_EQ(store.file(), before);
    other.lock.reset();
    EXPECT_EQ(store.add(L"c"), kSuccess);
    EXPECT_EQ(entries(store.file()), "11:c 10:b 1:a");
}

// Reading anew before a change is told of by no line.
TEST(Sharing, TheLogTellsEachStepOfAReadingAndOfASave) {
    StoreMachine store;
    LogCapture log;
    const std::string credentials = ttls(0, "z") + kBobs + ttls(2, "c") + ttls(1, "a");
    const std::string users = user("PC\\bob", "2:1") + user("PC\\alice", "1:1 9:2");
    ASSERT_EQ(store.openWith(document(credentials, users, "<enabledump>true</enabledump>")), kSuccess);
    EXPECT_EQ(
        log.text(),
        "Reading all credentials...\nRetrieved total 4 credentials:\n"
        "\tReading credential with index=1...\nInvalid credential id=0\n"
        "\tReading credential with index=2...\n\tReading credential with index=3...\n"
        "\tReading credential with index=4...\n"
        "ERROR: Found duplicate credential id=2, new id=3\n"
        "Reading all user info...\nRetrieved total 2 user info\n"
        "\tReading user info with index=1...\n\tReading user info with index=2...\n"
        "\t\tcredential count=2\n\t\t\tid=1, priority=1\n"
        "All-user credential deleted by others,we should delete this credential for current user, cred id=9\n"
        "\tDumping all credentials...\nCredential: id=3, name=c, priority=1\n"
        "Credential: id=1, name=a, priority=2\n");
    EXPECT_EQ(store.add(L"b"), kSuccess);
    EXPECT_EQ(log.text(),
              "ERROR: No nextcredid node in the config xml file.\nInvalid credential id=0\n"
              "Saving credentials to xml file...\n");
    EXPECT_EQ(entries(store.file()), "0:z 2:b 4:b 3:c 1:a");
    store.fail("rename");
    store.add(L"d");
    EXPECT_EQ(log.text(),
              "Invalid credential id=0\nSaving credentials to xml file...\n"
              "ERROR: Saving the configuration file failed.\n");
}

// The highest id counts whoever's it is, so that none is given out twice.
TEST(Sharing, ANextIdThatIsMissingFollowsAllIds) {
    StoreMachine store;
    const std::string credentials = ttls(1, "a") + ttls(40, "b", "PC\\bob", "peruser") + ttls(-50, "z");
    ASSERT_EQ(store.openWith(document(credentials, "", "")), kSuccess);
    EXPECT_EQ(store.config().nextCredId(), 41);
    ASSERT_EQ(store.openWith(document(ttls(2147483647, "a"), "", "")), kSuccess);
    EXPECT_EQ(store.config().nextCredId(), 2147483647);
}

}  // namespace
}  // namespace vexa::test
