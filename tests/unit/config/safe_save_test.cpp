#include <gtest/gtest.h>
#include <sys/stat.h>

#include <optional>

#include "config/Config.h"
#include "config/ResultCodes.h"
#include "config/SafeSave.h"
#include "platform/ClockControl.h"
#include "platform/Files.h"
#include "platform/KnownFolders.h"
#include "unit/config/StoreMachine.h"

namespace vexa::test {
namespace {

using platform::LockGuard;

std::wstring pathOf(const wchar_t* name) {
    return *platform::publicFolder() + L"\\Roaming\\Korvane\\" + name;
}

std::string fault(const std::string& call, int skip = 0, int times = 1, int error = 112) {
    return "{'do':'fail','call':'" + call + "','error':" + std::to_string(error) +
           ",'skip':" + std::to_string(skip) + ",'times':" + std::to_string(times) + "}";
}

TEST(SafeSave, ReplacesTheFileForItsOwnerOnly) {
    StoreMachine store;
    ASSERT_TRUE(saveSafely(pathOf(L"f"), "one"));
    ASSERT_TRUE(saveSafely(pathOf(L"f"), "two"));
    EXPECT_FALSE(saveSafely(pathOf(L"f"), "three", platform::Existing::Keep));
    EXPECT_EQ(store.read("f"), "two");
    EXPECT_EQ(store.listing(), "f");
    struct stat status {};
    ASSERT_EQ(::stat((store.folder() / "f").c_str(), &status), 0);
    EXPECT_EQ(status.st_mode & 07777, 0600U);
}

TEST(SafeSave, FoldersAreForTheirOwnerOnly) {
    StoreMachine store;
    ASSERT_TRUE(platform::createFolder(pathOf(L"New\\Below")));
    for (const char* name : {"New", "New/Below"}) {
        struct stat status {};
        ASSERT_EQ(::stat((store.folder() / name).c_str(), &status), 0) << name;
        EXPECT_EQ(status.st_mode & 07777, 0700U) << name;
    }
}

TEST(SafeSave, LeavesTheOldFileWholeWhereverItFails) {
    for (const char* call : {"open", "write", "sync", "rename"}) {
        StoreMachine store;
        ASSERT_TRUE(saveSafely(pathOf(L"f"), "old"));
        store.machine().ask(fault(call, 0, 100));
        EXPECT_FALSE(saveSafely(pathOf(L"f"), "new")) << call;
        EXPECT_EQ(store.read("f"), "old") << call;
        EXPECT_EQ(store.listing(), "f") << call;
    }
}

TEST(SafeSave, HasPatienceWithAReaderOfTheOldFile) {
    constexpr int kSharingViolation = 32;
    StoreMachine store;
    ASSERT_TRUE(saveSafely(pathOf(L"f"), "old"));
    store.machine().ask(fault("rename", 0, 3, kSharingViolation));
    EXPECT_TRUE(saveSafely(pathOf(L"f"), "new"));
    store.machine().ask(fault("rename", 0, 100, kSharingViolation));
    EXPECT_FALSE(saveSafely(pathOf(L"f"), "newer"));
    EXPECT_EQ(store.read("f"), "new");
    EXPECT_EQ(store.listing(), "f");
}

TEST(SafeSave, RemovesWhatAKilledProcessLeftAndNothingElse) {
    StoreMachine store;
    const auto held = platform::NewFile::create(pathOf(L"f.held.tmp"));
    ASSERT_TRUE(held);
    for (const char* name : {"f.0123.tmp", "f.x.tmp", "f.tmp", "g.0123.tmp", "f.0123.txt"})
        store.write(name, "left");
    ASSERT_TRUE(saveSafely(pathOf(L"f"), "new"));
    EXPECT_EQ(store.listing(), "f f.0123.txt f.held.tmp f.tmp g.0123.tmp");
}

std::int32_t add(Config& config, const std::wstring& realm) REQUIRES(g_hs20Lock) {
    CredentialInput input;
    input.type = 1;
    input.realm = realm;
    std::int32_t id = 0;
    EXPECT_EQ(config.credentials().addCredential(input, config.nextCredId(), config.userName(), id),
              kSuccess);
    config.advanceNextCredId();
    return id;
}

// Each of the three saves in turn fails at each of its calls on the disk. What is lost is that section's
// change, until the next save.
TEST(SafeSave, AFaultAtAnyPointCostsOneSectionUntilTheNextSave) {
    for (const char* call : {"write", "sync", "rename"})
        for (int section = 0; section < 3; ++section) {
            StoreMachine store;
            const LockGuard lock(g_hs20Lock);
            Config config;
            ASSERT_EQ(open(config), kSuccess);
            add(config, L"a");
            ASSERT_EQ(config.saveConfig(), kSuccess);
            add(config, L"b");
            store.machine().ask(fault(call, section));
            EXPECT_EQ(config.saveConfig(), kSuccess) << call << section;
            EXPECT_EQ(store.listing(), "Dump config.xml") << call << section;
            Config reader;
            ASSERT_EQ(open(reader), kSuccess) << call << section;
            EXPECT_EQ(reader.nextCredId(), section == 0 ? 2 : 3) << call;
            EXPECT_EQ(places(reader), section == 1 ? "1:2" : "2:1 1:2") << call << section;
            EXPECT_EQ(config.saveConfig(), kSuccess);
            ASSERT_EQ(open(reader), kSuccess);
            EXPECT_EQ(places(reader), "2:1 1:2") << call << section;
            EXPECT_EQ(reader.nextCredId(), 3) << call << section;
        }
}

// Two of the three sections look first whether the file can be opened; each opens it, and its new one.
TEST(SafeSave, AFileThatCannotBeOpenedIsLeftAsItIs) {
    for (int opened = 0; opened < 8; ++opened) {
        StoreMachine store;
        const LockGuard lock(g_hs20Lock);
        Config config;
        ASSERT_EQ(open(config), kSuccess);
        add(config, L"a");
        store.machine().ask(fault("open", opened));
        const bool isNewFile = opened == 2 || opened == 5 || opened == 7;
        EXPECT_EQ(config.saveConfig(), isNewFile ? kSuccess : kFailure) << opened;
        EXPECT_EQ(store.listing(), "Dump config.xml") << opened;
        Config reader;
        ASSERT_EQ(open(reader), kSuccess) << opened;
        EXPECT_EQ(config.saveConfig(), kSuccess) << opened;
        ASSERT_EQ(open(reader), kSuccess) << opened;
        EXPECT_EQ(places(reader), "1:1") << opened;
    }
}

TEST(SafeSave, AFullDiskAtTheFirstStartLeavesNoHalfFile) {
    for (const char* call : {"write", "sync", "rename"}) {
        StoreMachine store;
        store.machine().ask(fault(call, 0, 100));
        const LockGuard lock(g_hs20Lock);
        Config config;
        EXPECT_EQ(config.initPaths(), kSuccess);
        EXPECT_EQ(config.readConfig(nullptr), kNotFound) << call;
        EXPECT_EQ(store.listing(), "Dump") << call;
    }
}

TEST(SafeSave, FoldersThatCannotBeMadeEndTheStart) {
    for (int folder = 0; folder < 3; ++folder) {
        StoreMachine store;
        store.machine().ask(fault("CreateDirectory", folder));
        const LockGuard lock(g_hs20Lock);
        Config config;
        EXPECT_EQ(config.initPaths(), kFailure) << folder;
    }
}

}  // namespace
}  // namespace vexa::test
