#include <gtest/gtest.h>

#include "unit/config/StoreMachine.h"

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
        ASSERT_EQ(store.config().saveCredentials(), kSuccess) << c.story;
        EXPECT_EQ(store.file(), saved(c.after, "")) << c.story;
    }
}

TEST(Sharing, ASaveRewritesTheUsersOwnListAlone) {
    StoreMachine store;
    const std::string credentials = ttls(1, "a") + ttls(3, "c");
    const std::string bob = user("PC\\bob", "9:1 1:2");
    const std::string alice = user("PC\\alice", "3:1 1:2");
    const std::string users = alice + bob + user("PC\\alice", "7:1") + "<!-- n --><user><x/></user>";
    ASSERT_EQ(store.openWith(document(credentials, users)), kSuccess);
    ASSERT_EQ(store.config().saveUsers(), kSuccess);
    EXPECT_EQ(store.file(), saved(credentials, bob + "<!-- n --><user><x></x></user>" + alice));
}

TEST(Sharing, AFileThatLacksASectionIsOnlySavedWhereNothingIsLost) {
    StoreMachine store;
    ASSERT_EQ(store.openWith("<c><global/><users/></c>"), kSuccess);
    EXPECT_EQ(store.config().saveCredentials(), kSuccess);
    store.add(L"r");
    EXPECT_EQ(store.config().saveCredentials(), kFailure);
    store.write("config.xml", "<c><global/><credentials/></c>");
    EXPECT_EQ(store.config().saveUsers(), kFailure);
    EXPECT_EQ(store.file(), "<c><global/><credentials/></c>");
}

TEST(Sharing, AnEditByHandSurvivesInWhatASaveDoesNotRewrite) {
    const auto global = [](const std::string& nextId) {
        return "<homerealm>by hand</homerealm><nextcredid>" + nextId + "</nextcredid><x>y</x>";
    };
    const std::string bob = user("PC\\bob", "1:1");
    StoreMachine store;
    ASSERT_EQ(store.openWith(document(ttls(1, "a"), "")), kSuccess);
    store.write("config.xml", document(ttls(1, "by hand") + ttls(4, "new"), bob, global("77")));
    ASSERT_EQ(store.config().saveConfig(), kSuccess);
    EXPECT_EQ(store.file(), saved(ttls(1, "a"), bob + user("PC\\alice", "1:1"), global("10")));
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
