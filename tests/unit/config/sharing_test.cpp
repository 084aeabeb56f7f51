#include <gtest/gtest.h>

#include "config/Config.h"
#include "config/ResultCodes.h"
#include "unit/config/StoreMachine.h"

namespace vexa::test {
namespace {

using platform::LockGuard;

// The user is PC\alice.
TEST(Sharing, WhatAUserSeesAndWhetherHeMustSave) {
    struct Case {
        const char* story;
        std::string credentials;
        std::string users;
        const char* places;
        bool isChanged;
    };
    const std::string bobs = ttls(2, "b", "PC\\bob", "peruser");
    const std::string three = ttls(1, "a") + ttls(2, "b") + ttls(3, "c");
    const Case cases[] = {
        {"no credentials", "", "", "", false},
        {"first read: file order, and nothing to save", three, "", "1:1 2:2 3:3", false},
        {"his own order", three, user("PC\\alice", "3:1 1:2 2:3"), "3:1 1:2 2:3", false},
        {"another's order", three, user("PC\\bob", "3:1 1:2 2:3"), "1:1 2:2 3:3", false},
        {"the first of two lists", three, user("PC\\alice", "3:1 2:2 1:3") + user("PC\\alice", "1:1 2:2 3:3"),
         "3:1 2:2 1:3", false},
        {"names are told apart by case", three, user("pc\\alice", "3:1 1:2 2:3"), "1:1 2:2 3:3", false},
        {"another's private one", ttls(1, "a") + bobs, user("PC\\alice", "1:1"), "1:1", false},
        {"his own private one", ttls(1, "a", "PC\\alice", "peruser"), "", "1:1", false},
        {"a public one of another", ttls(1, "a", "PC\\bob"), "", "1:1", false},
        {"one that others added comes first", three, user("PC\\alice", "2:1 1:2"), "3:1 2:2 1:3", true},
        {"one that others deleted", ttls(1, "a"), user("PC\\alice", "5:1 1:2"), "1:2", true},
        {"a listed one without a place", three, user("PC\\alice", "3:1 1:-1 2:2"), "1:1 3:2 2:3", false},
        {"a listed one with an empty place", three,
         "<user><username>PC\\alice</username><credentials><credential><id>2</id><priority/></credential>"
         "<credential><id>1</id><priority>1</priority></credential>"
         "<credential><id>3</id><priority>2</priority></credential></credentials></user>",
         "2:1 1:2 3:3", false},
        {"place 0 stays before all", three, user("PC\\alice", "3:0 1:1 2:2"), "3:0 1:1 2:2", false},
        {"place 9999 is none", three, user("PC\\alice", "3:9999 1:1 2:2"), "3:1 1:2 2:3", false},
        {"references to nothing", three, user("PC\\alice", "0:1 -4:2 1:1 2:2 3:3"), "1:1 2:2 3:3", false},
        {"a stale reference without a place", three, user("PC\\alice", "9:-1 1:1 2:2 3:3"), "1:1 2:2 3:3",
         false},
        {"a user without a list", three, "<user><username>PC\\alice</username></user>", "1:1 2:2 3:3", true},
        {"ids that are none", ttls(0, "a") + ttls(-1, "b") + "<credential/>" + ttls(4, "d"), "", "4:1",
         false},
        {"an unknown type",
         "<credential><id>3</id><type>eapsim</type><accesstype>alluser</accesstype></credential>", "", "",
         false},
        {"an unknown access", ttls(1, "a", "PC\\alice", "everyone"), "", "", false},
        {"elements of another name count",
         "<x><id>6</id><type>eaptls</type><accesstype>alluser</accesstype></x>", "", "6:1", false},
    };
    for (const Case& c : cases) {
        StoreMachine store;
        store.write("config.xml", document(c.credentials, c.users));
        const LockGuard lock(g_hs20Lock);
        Config config;
        bool isChanged = !c.isChanged;
        ASSERT_EQ(open(config, &isChanged), kSuccess) << c.story;
        EXPECT_EQ(places(config), c.places) << c.story;
        EXPECT_EQ(isChanged, c.isChanged) << c.story;
        EXPECT_EQ(store.config(), document(c.credentials, c.users)) << c.story;
    }
}

// What a save of PC\alice leaves of the section of credentials.
TEST(Sharing, WhatASaveKeepsAndWhatItTakesAway) {
    struct Case {
        const char* story;
        std::string before;
        std::string after;
    };
    const std::string bobs = ttls(2, "b", "PC\\bob", "peruser");
    const std::string odd =
        "<credential a=\"1\"><id>7</id><type>eapttls</type><accesstype>peruser</accesstype>"
        "<creator>PC\\bob</creator><x>y</x></credential>";
    const Case cases[] = {
        {"another's private one stays, in front", ttls(1, "a") + bobs, bobs + ttls(1, "a")},
        {"another's public one becomes the saver's", ttls(1, "a", "PC\\bob"), ttls(1, "a")},
        {"his own private one stays private", ttls(1, "a", "PC\\alice", "peruser"),
         ttls(1, "a", "PC\\alice", "peruser")},
        {"no id stays", "<credential><x>y</x></credential>" + ttls(0, "z") + ttls(1, "a"),
         "<credential><x>y</x></credential>" + ttls(0, "z") + ttls(1, "a")},
        {"an unknown type that all see goes",
         "<credential><id>3</id><type>eapsim</type><accesstype>alluser</accesstype></credential>", ""},
        {"an unknown type of his own goes",
         "<credential><id>3</id><type>eapsim</type><accesstype>peruser</accesstype>"
         "<creator>PC\\alice</creator></credential>",
         ""},
        {"an unknown type of another stays",
         "<credential><id>3</id><type>eapsim</type><accesstype>peruser</accesstype>"
         "<creator>PC\\bob</creator></credential>",
         "<credential><id>3</id><type>eapsim</type><accesstype>peruser</accesstype>"
         "<creator>PC\\bob</creator></credential>"},
        {"an unknown access goes", ttls(1, "a", "PC\\bob", "everyone"), ""},
        {"a private one of nobody stays",
         "<credential><id>5</id><accesstype>peruser</accesstype></credential>",
         "<credential><id>5</id><accesstype>peruser</accesstype></credential>"},
        {"what another's holds stays", odd, odd},
        {"what his own holds beyond the known goes",
         "<credential><id>1</id><type>eaptls</type><accesstype>alluser</accesstype><realm>r</realm><x>y</x>"
         "<username>u</username></credential>",
         "<credential><id>1</id><type>eaptls</type><accesstype>alluser</accesstype><creator>PC\\alice</"
         "creator>"
         "<eap>1</eap><autoconnect>true</autoconnect><credname>r</credname><realm>r</realm><cacert></cacert>"
         "<clientcert></clientcert></credential>"},
        {"an outer method without a number",
         "<credential><id>1</id><type>eapttls</type><accesstype>alluser</accesstype><creator>x</creator>"
         "<autoconnect>True</autoconnect><credname></credname><realm>r</realm></credential>",
         "<credential><id>1</id><type>eapttls</type><accesstype>alluser</accesstype><creator>PC\\alice</"
         "creator>"
         "<eap>0</eap><autoconnect>false</autoconnect><credname>r</credname><realm>r</realm><username></"
         "username>"
         "<password></password></credential>"},
    };
    for (const Case& c : cases) {
        StoreMachine store;
        store.write("config.xml", document(c.before, ""));
        const LockGuard lock(g_hs20Lock);
        Config config;
        ASSERT_EQ(open(config), kSuccess) << c.story;
        ASSERT_EQ(config.saveCredentials(), kSuccess) << c.story;
        EXPECT_EQ(store.config(), "\xEF\xBB\xBF" + document(c.after, "")) << c.story;
    }
}

TEST(Sharing, ASaveRewritesTheUsersOwnListAlone) {
    StoreMachine store;
    const std::string credentials = ttls(1, "a") + ttls(3, "c");
    const std::string bob = user("PC\\bob", "9:1 1:2");
    store.write("config.xml",
                document(credentials, user("PC\\alice", "3:1 1:2") + bob + user("PC\\alice", "7:1") +
                                          "<!-- n --><user><x/></user>"));
    const LockGuard lock(g_hs20Lock);
    Config config;
    ASSERT_EQ(open(config), kSuccess);
    ASSERT_EQ(config.saveUsers(), kSuccess);
    EXPECT_EQ(store.config(), "\xEF\xBB\xBF" + document(credentials, bob + "<!-- n --><user><x></x></user>" +
                                                                         user("PC\\alice", "3:1 1:2")));
}

TEST(Sharing, AFileThatLacksASectionIsOnlySavedWhereNothingIsLost) {
    StoreMachine store;
    store.write("config.xml", "<c><global/><users/></c>");
    const LockGuard lock(g_hs20Lock);
    Config config;
    ASSERT_EQ(open(config), kSuccess);
    EXPECT_EQ(config.saveCredentials(), kSuccess);
    CredentialInput input;
    input.type = 1;
    input.realm = L"r";
    std::int32_t id = 0;
    ASSERT_EQ(config.credentials().addCredential(input, 1, L"u", id), kSuccess);
    EXPECT_EQ(config.saveCredentials(), kFailure);
    store.write("config.xml", "<c><global/><credentials/></c>");
    EXPECT_EQ(config.saveUsers(), kFailure);
    EXPECT_EQ(store.config(), "<c><global/><credentials/></c>");
}

TEST(Sharing, AnEditByHandSurvivesInWhatASaveDoesNotRewrite) {
    StoreMachine store;
    store.write("config.xml", document(ttls(1, "a"), ""));
    const LockGuard lock(g_hs20Lock);
    Config config;
    ASSERT_EQ(open(config), kSuccess);
    store.write("config.xml", document(ttls(1, "by hand") + ttls(4, "new"), user("PC\\bob", "1:1"),
                                       "<homerealm>by hand</homerealm><nextcredid>77</nextcredid><x>y</x>"));
    ASSERT_EQ(config.saveConfig(), kSuccess);
    EXPECT_EQ(store.config(),
              "\xEF\xBB\xBF" + document(ttls(1, "a"), user("PC\\bob", "1:1") + user("PC\\alice", "1:1"),
                                        "<homerealm>by hand</homerealm><nextcredid>10</nextcredid><x>y</x>"));
}

// The highest id counts whoever's it is, so that none is given out twice.
TEST(Sharing, ANextIdThatIsMissingFollowsAllIds) {
    StoreMachine store;
    store.write("config.xml",
                document(ttls(1, "a") + ttls(40, "b", "PC\\bob", "peruser") + ttls(-50, "z"), "", ""));
    const LockGuard lock(g_hs20Lock);
    Config config;
    ASSERT_EQ(open(config), kSuccess);
    EXPECT_EQ(config.nextCredId(), 41);
    store.write("config.xml", document(ttls(2147483647, "a"), "", ""));
    ASSERT_EQ(open(config), kSuccess);
    EXPECT_EQ(config.nextCredId(), 2147483647);
}

}  // namespace
}  // namespace vexa::test
