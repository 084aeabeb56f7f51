#include <gtest/gtest.h>
#include <sys/stat.h>

#include "config/Config.h"
#include "config/ResultCodes.h"
#include "unit/config/StoreMachine.h"

namespace vexa::test {
namespace {

using platform::LockGuard;

constexpr std::string_view kDefault =
    "\xEF\xBB\xBF<?xml version=\"1.0\" encoding=\"UTF-8\"?><configurations>\t<global>\t\t"
    "<dump_file_path>hs20log.txt</dump_file_path>\t\t<create_new_dump_file>true</create_new_dump_file>\t\t"
    "<autoconnect>true</autoconnect>\t\t<enabledump>false</enabledump>\t\t<dumplevel>0</dumplevel>\t\t"
    "<homerealm></homerealm>\t\t<nextcredid>1</nextcredid>\t</global>\t<credentials>\t</credentials>\t"
    "<users>\t</users></configurations>";

mode_t modeOf(const std::filesystem::path& path) {
    struct stat status {};
    EXPECT_EQ(::stat(path.c_str(), &status), 0) << path;
    return status.st_mode & 07777;
}

TEST(ConfigFile, IsMadeWhereThereIsNone) {
    StoreMachine store;
    std::filesystem::remove_all(store.machine()->folder() / "Public");
    const LockGuard lock(g_hs20Lock);
    Config config;
    bool isChanged = true;
    ASSERT_EQ(open(config, &isChanged), kSuccess);
    EXPECT_FALSE(isChanged);
    EXPECT_EQ(store.config(), kDefault);
    EXPECT_EQ(store.listing(), "Dump config.xml");
    EXPECT_EQ(config.dumpFilePath(), L"C:\\Users\\Public\\Roaming\\Korvane\\Dump\\hs20log_alice_0.txt");
    EXPECT_TRUE(config.isAutoConnect());
    EXPECT_FALSE(config.isDumpEnabled());
    EXPECT_EQ(config.homeRealm(), L"");
    EXPECT_EQ(config.nextCredId(), 1);
    EXPECT_EQ(places(config), "");
    EXPECT_EQ(modeOf(store.configFile()), 0600U);
    EXPECT_EQ(modeOf(store.folder() / "Dump"), 0700U);
    EXPECT_EQ(modeOf(store.folder()), 0700U);
    EXPECT_EQ(modeOf(store.folder().parent_path()), 0700U);
}

TEST(ConfigFile, KeepsItsOtherSectionsThroughCyclesOfLoadChangeAndSave) {
    StoreMachine store;
    const LockGuard lock(g_hs20Lock);
    Config config;
    ASSERT_EQ(open(config), kSuccess);
    ASSERT_EQ(config.saveConfig(), kSuccess);
    const std::string once = store.config();
    EXPECT_EQ(once.substr(0, once.find("<users>")), kDefault.substr(0, kDefault.find("<users>")));
    for (int i = 0; i < 3; ++i) {
        ASSERT_EQ(config.saveConfig(), kSuccess);
        ASSERT_EQ(config.readConfig(nullptr), kSuccess);
    }
    EXPECT_EQ(store.config(), once);
    EXPECT_EQ(modeOf(store.configFile()), 0600U);
}

// What each key gives if it is missing, empty, or holds something odd.
TEST(ConfigFile, GlobalKeys) {
    const auto pathOf = [](const wchar_t* name) {
        return std::wstring(L"C:\\Users\\Public\\Roaming\\Korvane\\Dump\\") + name;
    };
    struct Case {
        const char* global;
        std::wstring dumpFile;
        bool autoConnect;
        bool dump;
        const wchar_t* homeRealm;
        int nextId;
    };
    const std::wstring usual = pathOf(L"hs20log.txt_alice.txt");
    const Case cases[] = {
        {"", usual, true, false, L"", 1},
        {"<dump_file_path/><autoconnect/><enabledump/><homerealm/><nextcredid/>", usual, false, false, L"",
         1},
        {"<dump_file_path>x</dump_file_path>", pathOf(L"x_alice.txt"), true, false, L"", 1},
        {"<dump_file_path> </dump_file_path>", pathOf(L" _alice.txt"), true, false, L"", 1},
        {"<create_new_dump_file>true</create_new_dump_file>", pathOf(L"hs20log_alice_0.txt"), true, false,
         L"", 1},
        {"<create_new_dump_file>True</create_new_dump_file>", usual, true, false, L"", 1},
        {"<create_new_dump_file>true</create_new_dump_file><dump_file_path>a.txt.txt</dump_file_path>",
         pathOf(L"a_alice_0.txt"), true, false, L"", 1},
        {"<create_new_dump_file>true</create_new_dump_file><dump_file_path>plain</dump_file_path>",
         pathOf(L"plain_alice_0.txt"), true, false, L"", 1},
        {"<create_new_dump_file>true</create_new_dump_file><dump_file_path>.txt</dump_file_path>",
         pathOf(L"_alice_0.txt"), true, false, L"", 1},
        {"<autoconnect>false</autoconnect>", usual, false, false, L"", 1},
        {"<autoconnect>TRUE</autoconnect>", usual, false, false, L"", 1},
        {"<autoconnect>true </autoconnect>", usual, false, false, L"", 1},
        {"<autoconnect><!-- really -->true</autoconnect>", usual, true, false, L"", 1},
        {"<enabledump>true</enabledump>", usual, true, true, L"", 1},
        {"<enabledump>TRUE</enabledump>", usual, true, false, L"", 1},
        {"<homerealm> h\xC3\xA9 &amp; </homerealm>", usual, true, false, L" h\u00E9 & ", 1},
        {"<nextcredid>7</nextcredid>", usual, true, false, L"", 7},
        {"<nextcredid> +12abc</nextcredid>", usual, true, false, L"", 12},
        {"<nextcredid>0</nextcredid>", usual, true, false, L"", 1},
        {"<nextcredid>-4</nextcredid>", usual, true, false, L"", 1},
        {"<nextcredid>x</nextcredid>", usual, true, false, L"", 1},
        {"<nextcredid>99999999999</nextcredid>", usual, true, false, L"", 2147483647},
    };
    for (const Case& c : cases) {
        StoreMachine store;
        store.write("config.xml", document("", "", c.global));
        const LockGuard lock(g_hs20Lock);
        Config config;
        ASSERT_EQ(open(config), kSuccess) << c.global;
        EXPECT_EQ(config.dumpFilePath(), c.dumpFile) << c.global;
        EXPECT_EQ(config.isAutoConnect(), c.autoConnect) << c.global;
        EXPECT_EQ(config.isDumpEnabled(), c.dump) << c.global;
        EXPECT_EQ(config.homeRealm(), c.homeRealm) << c.global;
        EXPECT_EQ(config.nextCredId(), c.nextId) << c.global;
        EXPECT_EQ(store.config(), document("", "", c.global));
    }
}

TEST(ConfigFile, CountsDumpFilesUpToAHundredAndCutsTheirPaths) {
    const std::string counting = "<create_new_dump_file>true</create_new_dump_file>";
    StoreMachine store;
    std::filesystem::create_directories(store.folder() / "Dump");
    const LockGuard lock(g_hs20Lock);
    Config config;
    store.write("config.xml", document("", "", counting));
    const std::wstring start = L"C:\\Users\\Public\\Roaming\\Korvane\\Dump\\";
    for (int taken = 0; taken < 100; ++taken) {
        if (taken % 33 == 0) {
            ASSERT_EQ(open(config), kSuccess);
            EXPECT_EQ(config.dumpFilePath(), start + L"hs20log_alice_" + std::to_wstring(taken) + L".txt");
        }
        store.write("Dump/hs20log_alice_" + std::to_string(taken) + ".txt", "");
    }
    ASSERT_EQ(open(config), kSuccess);
    EXPECT_EQ(config.dumpFilePath(), L"hs20log.txt");

    const std::string longName(300, 'n');
    store.write("config.xml",
                document("", "", counting + "<dump_file_path>" + longName + "</dump_file_path>"));
    ASSERT_EQ(open(config), kSuccess);
    EXPECT_EQ(config.dumpFilePath(), start + std::wstring(254 - start.size(), L'n'));
}

TEST(ConfigFile, NamesTheDumpFileAfterTheUser) {
    struct Case {
        const char* user;
        const wchar_t* suffix;
    };
    for (const Case& c : {Case{"alice", L"alice"}, Case{"A\\\\B\\\\carol", L"carol"}, Case{"PC\\\\", L""}}) {
        StoreMachine store(c.user);
        store.write("config.xml", document("", ""));
        const LockGuard lock(g_hs20Lock);
        Config config;
        ASSERT_EQ(open(config), kSuccess) << c.user;
        EXPECT_TRUE(
            config.dumpFilePath().ends_with(std::wstring(L"\\Dump\\hs20log.txt_") + c.suffix + L".txt"));
    }
}

TEST(ConfigFile, IsNotMadeForNobody) {
    StoreMachine store("");
    const LockGuard lock(g_hs20Lock);
    Config config;
    EXPECT_EQ(open(config), kFailure);
    EXPECT_EQ(store.listing(), "");
}

TEST(ConfigFile, TheSwitchComesFromTheRegistry) {
    struct Case {
        const char* text;
        bool isOn;
    };
    const Case cases[] = {{"null", true},        {"'true'", true},   {"'TRUE'", true}, {"'false'", false},
                          {"'FALSE'", false},    {"'fAlSe'", false}, {"''", true},     {"'false '", true},
                          {"'falsehood'", true}, {"'0'", true}};
    for (const Case& c : cases) {
        StoreMachine store;
        store.machine().ask(std::string("{'do':'setRegistry','value':") + c.text + "}");
        const LockGuard lock(g_hs20Lock);
        Config config;
        config.m_bHotSpotAutoConnect = !c.isOn;
        ASSERT_EQ(open(config), kSuccess);
        EXPECT_EQ(config.m_bHotSpotAutoConnect, c.isOn) << c.text;
    }
}

TEST(ConfigFile, WhatDoesNotParseIsLeftAlone) {
    for (const char* content :
         {"", "garbage", "<configurations>", "<configurations/>x", "\xEF\xBB\xBF", "&"}) {
        StoreMachine store;
        store.write("config.xml", content);
        const LockGuard lock(g_hs20Lock);
        Config config;
        ASSERT_EQ(config.initPaths(), kSuccess);
        EXPECT_EQ(config.readConfig(nullptr), kFailure) << content;
        EXPECT_EQ(config.saveConfig(), kFailure) << content;
        EXPECT_EQ(config.saveNextCredId(), kFailure) << content;
        EXPECT_EQ(config.saveCredentials(), kFailure) << content;
        EXPECT_EQ(config.saveUsers(), kFailure) << content;
        EXPECT_EQ(store.config(), content);
        EXPECT_EQ(store.listing(), "Dump config.xml");
    }
}

TEST(ConfigFile, ThatHasGoneIsNotFound) {
    StoreMachine store;
    const LockGuard lock(g_hs20Lock);
    Config config;
    ASSERT_EQ(open(config), kSuccess);
    std::filesystem::remove(store.configFile());
    EXPECT_EQ(config.readConfig(nullptr), kNotFound);
    EXPECT_EQ(config.saveNextCredId(), kNotFound);
    EXPECT_EQ(config.saveCredentials(), kNotFound);
    EXPECT_EQ(config.saveUsers(), kFailure);
    EXPECT_EQ(store.listing(), "Dump");
}

TEST(ConfigFile, GetsALostNextIdBackWithTheNextSave) {
    for (const char* content : {"<c><global/><credentials/><users/></c>", "<c><credentials/><users/></c>"}) {
        StoreMachine store;
        store.write("config.xml", content);
        const LockGuard lock(g_hs20Lock);
        Config config;
        ASSERT_EQ(open(config), kSuccess);
        EXPECT_EQ(config.nextCredId(), 1);
        EXPECT_EQ(store.config(), content);
        config.advanceNextCredId();
        EXPECT_EQ(config.saveConfig(), kSuccess);
        EXPECT_NE(store.config().find("<nextcredid>2</nextcredid></global>"), std::string::npos)
            << store.config();
        EXPECT_EQ(config.readConfig(nullptr), kSuccess);
        EXPECT_EQ(config.nextCredId(), 2);
    }
}

TEST(ConfigFile, CannotBeSpoiledByAnAccountThatXmlCannotHold) {
    StoreMachine store("PC\\\\a\\u0001");
    store.write("config.xml", document("", ""));
    const LockGuard lock(g_hs20Lock);
    Config config;
    ASSERT_EQ(open(config), kSuccess);
    EXPECT_EQ(config.saveConfig(), kFailure);
    EXPECT_EQ(config.readConfig(nullptr), kSuccess);
}

}  // namespace
}  // namespace vexa::test
