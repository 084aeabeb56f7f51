#include <gtest/gtest.h>

#include "unit/config/StoreMachine.h"

namespace vexa::test {
namespace {

const std::wstring kDump = L"C:\\Users\\Public\\Roaming\\Korvane\\Dump\\";

TEST(ConfigFile, IsMadeWhereThereIsNoneAndKeepsItsOtherSections) {
    StoreMachine store;
    std::filesystem::remove_all(store.machine()->folder() / "Public");
    Config& config = store.config();
    bool isChanged = true;
    ASSERT_EQ(open(config, &isChanged), kSuccess);
    EXPECT_FALSE(isChanged);
    EXPECT_EQ(store.listing(), "Dump config.xml");
    EXPECT_EQ(config.dumpFilePath(), kDump + L"hs20log_alice_0.txt");
    EXPECT_TRUE(config.isAutoConnect());
    EXPECT_FALSE(config.isDumpEnabled());
    EXPECT_EQ(config.nextCredId(), 1);
    const std::string made = store.file();
    ASSERT_EQ(store.save(), kSuccess);
    const std::string once = store.file();
    EXPECT_EQ(once.substr(0, once.find("<users>")), made.substr(0, made.find("<users>")));
    ASSERT_EQ(config.readConfig(nullptr), kSuccess);
    ASSERT_EQ(store.save(), kSuccess);
    EXPECT_EQ(store.file(), once);
}

// What each key gives if it is missing, empty, or holds something odd.
TEST(ConfigFile, GlobalKeys) {
    struct Case {
        std::string global;
        std::wstring dumpFile = L"hs20log.txt_alice.txt";
        bool autoConnect = true;
        bool dump = false;
        std::wstring homeRealm = L"";
        int nextId = 1;
    };
    const std::string counting = "<create_new_dump_file>true</create_new_dump_file>";
    const Case cases[] = {
        {""},
        {.global = "<dump_file_path/><autoconnect/><enabledump/><homerealm/><nextcredid/>",
         .autoConnect = false},
        {"<dump_file_path> </dump_file_path>", L" _alice.txt"},
        {counting, L"hs20log_alice_0.txt"},
        {"<create_new_dump_file>True</create_new_dump_file>"},
        {counting + "<dump_file_path>a.txt.txt</dump_file_path>", L"a_alice_0.txt"},
        {counting + "<dump_file_path>plain</dump_file_path>", L"plain_alice_0.txt"},
        {.global = "<autoconnect>TRUE</autoconnect>", .autoConnect = false},
        {.global = "<autoconnect>true </autoconnect>", .autoConnect = false},
        {"<autoconnect><!-- really -->true</autoconnect>"},
        {.global = "<enabledump>true</enabledump>", .dump = true},
        {"<enabledump>TRUE</enabledump>"},
        {.global = "<homerealm> h\xC3\xA9 &amp; </homerealm>", .homeRealm = L" h\u00E9 & "},
        {.global = "<nextcredid> +12abc</nextcredid>", .nextId = 12},
        {"<nextcredid>-4</nextcredid>"},
        {"<nextcredid>x</nextcredid>"},
        {.global = "<nextcredid>99999999999</nextcredid>", .nextId = 2147483647},
    };
    for (const Case& c : cases) {
        StoreMachine store;
        const Config& config = store.config();
        ASSERT_EQ(store.openWith(document("", "", c.global)), kSuccess) << c.global;
        EXPECT_EQ(config.dumpFilePath(), kDump + c.dumpFile) << c.global;
        EXPECT_EQ(config.isAutoConnect(), c.autoConnect) << c.global;
        EXPECT_EQ(config.isDumpEnabled(), c.dump) << c.global;
        EXPECT_EQ(config.homeRealm(), c.homeRealm) << c.global;
        EXPECT_EQ(config.nextCredId(), c.nextId) << c.global;
        EXPECT_EQ(store.file(), document("", "", c.global));
    }
}

TEST(ConfigFile, CountsDumpFilesUpToAHundred) {
    const std::string counting = "<create_new_dump_file>true</create_new_dump_file>";
    StoreMachine store;
    std::filesystem::create_directories(store.folder() / "Dump");
    for (int taken = 0; taken < 100; ++taken) {
        if (taken % 33 == 0) {
            ASSERT_EQ(store.openWith(document("", "", counting)), kSuccess);
            EXPECT_EQ(store.config().dumpFilePath(),
                      kDump + L"hs20log_alice_" + std::to_wstring(taken) + L".txt");
        }
        store.write("Dump/hs20log_alice_" + std::to_string(taken) + ".txt", "");
    }
    ASSERT_EQ(open(store.config()), kSuccess);
    EXPECT_EQ(store.config().dumpFilePath(), L"hs20log.txt");
}

TEST(ConfigFile, KeepsTheDumpFileInItsFolderAndItsEnding) {
    const std::size_t longest = 254 - kDump.size() - std::string("_alice_99.txt").size();
    const std::pair<std::string, std::wstring> cases[] = {
        {"..\\..\\x", L"hs20log.txt"},
        {"a/b", L"hs20log.txt"},
        {"C:x", L"hs20log.txt"},
        {"x.txt:stream", L"hs20log.txt"},
        {"a..txt", L"hs20log.txt"},
        {".x", L".x"},
        {std::string(longest, 'n'), std::wstring(longest, L'n')},
        {std::string(longest + 1, 'n'), L"hs20log.txt"}};
    for (const auto& [name, taken] : cases) {
        StoreMachine store;
        ASSERT_EQ(store.openWith(document("", "", "<dump_file_path>" + name + "</dump_file_path>")),
                  kSuccess);
        EXPECT_EQ(store.config().dumpFilePath(), kDump + taken + L"_alice.txt") << name;
    }
}

TEST(ConfigFile, NamesTheDumpFileAfterTheUserAndIsNotMadeForNobody) {
    const std::pair<const char*, const wchar_t*> cases[] = {
        {"carol", L"carol.txt"}, {"A\\\\B\\\\carol", L"carol.txt"}, {"PC\\\\", L".txt"}};
    for (const auto& [name, ending] : cases) {
        StoreMachine store(name);
        ASSERT_EQ(store.openWith(document("", "")), kSuccess) << name;
        EXPECT_EQ(store.config().dumpFilePath(), kDump + L"hs20log.txt_" + ending);
    }
    StoreMachine store("");
    EXPECT_EQ(open(store.config()), kFailure);
    EXPECT_EQ(store.listing(), "");
}

TEST(ConfigFile, TheSwitchComesFromTheRegistry) {
    const std::pair<const char*, bool> cases[] = {{"null", true}, {"'TRUE'", true},   {"'fAlSe'", false},
                                                  {"''", true},   {"'false '", true}, {"'0'", true}};
    for (const auto& [text, isOn] : cases) {
        StoreMachine store;
        store.machine().ask(std::string("{'do':'setRegistry','value':") + text + "}");
        store.config().m_bHotSpotAutoConnect = !isOn;
        ASSERT_EQ(open(store.config()), kSuccess);
        EXPECT_EQ(store.config().m_bHotSpotAutoConnect, isOn) << text;
    }
}

TEST(ConfigFile, WhatDoesNotParseIsLeftAlone) {
    for (const char* content : {"", "garbage", "<configurations>"}) {
        StoreMachine store;
        EXPECT_EQ(store.openWith(content), kFailure) << content;
        EXPECT_EQ(store.save(), kFailure) << content;
        EXPECT_EQ(store.file(), content);
        EXPECT_EQ(store.listing(), "Dump config.xml");
    }
}

TEST(ConfigFile, ThatHasGoneIsNotFound) {
    StoreMachine store;
    Config& config = store.config();
    ASSERT_EQ(open(config), kSuccess);
    std::filesystem::remove(store.folder() / "config.xml");
    EXPECT_EQ(config.readConfig(nullptr), kNotFound);
    EXPECT_EQ(store.add(L"a"), kFailure);
    EXPECT_EQ(store.listing(), "Dump");
}

TEST(ConfigFile, GetsALostNextIdBackWithTheNextSave) {
    for (const char* content : {"<c><global/><credentials/><users/></c>", "<c><credentials/><users/></c>"}) {
        StoreMachine store;
        ASSERT_EQ(store.openWith(content), kSuccess);
        EXPECT_EQ(store.file(), content);
        store.config().advanceNextCredId();
        EXPECT_EQ(store.save(), kSuccess);
        EXPECT_NE(store.file().find("<nextcredid>2</nextcredid></global>"), std::string::npos)
            << store.file();
    }
}

}  // namespace
}  // namespace vexa::test
