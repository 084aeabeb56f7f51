#include "config/SafeSave.h"

#include <gtest/gtest.h>

#include "platform/Files.h"
#include "platform/KnownFolders.h"
#include "unit/config/StoreMachine.h"

namespace vexa::test {
namespace {

constexpr int kSharingViolation = 32;

std::wstring pathOf(const wchar_t* name) {
    return *platform::publicFolder() + L"\\Roaming\\Korvane\\" + name;
}

TEST(SafeSave, ReplacesTheFileAndRemovesWhatAKilledProcessLeftAndNothingElse) {
    StoreMachine store;
    ASSERT_TRUE(saveSafely(pathOf(L"f"), "one"));
    EXPECT_FALSE(saveSafely(pathOf(L"f"), "two", platform::Existing::Keep));
    EXPECT_EQ(store.read("f"), "one");
    const auto held = platform::NewFile::create(pathOf(L"f.00112233445566aa.tmp"));
    ASSERT_TRUE(held);
    for (const char* name : {"f.0123456789abcdef.tmp", "f.0123456789abcdeg.tmp", "f.0123.tmp", "f.tmp",
                             "g.0123456789abcdef.tmp", "f.0123456789abcdef.txt"})
        store.write(name, "left");
    ASSERT_TRUE(saveSafely(pathOf(L"f"), "three"));
    EXPECT_EQ(store.read("f"), "three");
    EXPECT_EQ(store.listing(),
              "f f.00112233445566aa.tmp f.0123.tmp f.0123456789abcdef.txt f.0123456789abcdeg.tmp f.tmp "
              "g.0123456789abcdef.tmp");
}

TEST(SafeSave, LeavesTheOldFileWholeWhereverItFails) {
    for (const char* call : {"open", "write", "sync", "rename"}) {
        StoreMachine store;
        ASSERT_TRUE(saveSafely(pathOf(L"f"), "old"));
        store.fail(call, 0, 100);
        EXPECT_FALSE(saveSafely(pathOf(L"f"), "new")) << call;
        EXPECT_EQ(store.read("f"), "old") << call;
        EXPECT_EQ(store.listing(), "f") << call;
    }
}

TEST(SafeSave, HasPatienceWithAReaderOfTheOldFile) {
    StoreMachine store;
    ASSERT_TRUE(saveSafely(pathOf(L"f"), "old"));
    store.fail("rename", 0, 3, kSharingViolation);
    EXPECT_TRUE(saveSafely(pathOf(L"f"), "new"));
    store.fail("rename", 0, 100, kSharingViolation);
    EXPECT_FALSE(saveSafely(pathOf(L"f"), "newer"));
    EXPECT_EQ(store.read("f"), "new");
}

// Each of the three saves in turn fails at each of its calls on the disk. What is lost is that section's
// change, until the next save.
TEST(SafeSave, AFaultAtAnyPointCostsOneSectionUntilTheNextSave) {
    for (const char* call : {"write", "sync", "rename"})
        for (int section = 0; section < 3; ++section) {
            SCOPED_TRACE(call + std::to_string(section));
            StoreMachine store;
            ASSERT_EQ(open(store.config()), kSuccess);
            store.add(L"a");
            ASSERT_EQ(store.config().saveConfig(), kSuccess);
            store.add(L"b");
            store.fail(call, section);
            EXPECT_EQ(store.config().saveConfig(), kSuccess);
            EXPECT_EQ(store.listing(), "Dump config.xml");
            Config reader;
            ASSERT_EQ(open(reader), kSuccess);
            EXPECT_EQ(reader.nextCredId(), section == 0 ? 2 : 3);
            EXPECT_EQ(places(reader.credentials()), section == 1 ? "1:2" : "2:1 1:2");
            EXPECT_EQ(store.config().saveConfig(), kSuccess);
            ASSERT_EQ(open(reader), kSuccess);
            EXPECT_EQ(places(reader.credentials()), "2:1 1:2");
            EXPECT_EQ(reader.nextCredId(), 3);
        }
}

// Two of the three sections look first whether the file can be opened; each opens it, and its new one.
TEST(SafeSave, AFileThatCannotBeOpenedIsLeftAsItIs) {
    for (int opened = 0; opened < 8; ++opened) {
        SCOPED_TRACE(opened);
        StoreMachine store;
        ASSERT_EQ(open(store.config()), kSuccess);
        store.add(L"a");
        store.fail("open", opened);
        const bool isNewFile = opened == 2 || opened == 5 || opened == 7;
        EXPECT_EQ(store.config().saveConfig(), isNewFile ? kSuccess : kFailure);
        EXPECT_EQ(store.listing(), "Dump config.xml");
        Config reader;
        ASSERT_EQ(open(reader), kSuccess);
        EXPECT_EQ(store.config().saveConfig(), kSuccess);
        ASSERT_EQ(open(reader), kSuccess);
        EXPECT_EQ(places(reader.credentials()), "1:1");
    }
}

TEST(SafeSave, AFullDiskAtTheFirstStartLeavesNoHalfFile) {
    for (const char* call : {"write", "sync", "rename"}) {
        StoreMachine store;
        store.fail(call, 0, 100);
        EXPECT_EQ(open(store.config()), kNotFound) << call;
        EXPECT_EQ(store.listing(), "Dump") << call;
    }
}

TEST(SafeSave, FoldersThatCannotBeMadeEndTheStart) {
    for (int folder = 0; folder < 3; ++folder) {
        StoreMachine store;
        store.fail("CreateDirectory", folder);
        EXPECT_EQ(store.config().initPaths(), kFailure) << folder;
    }
}

}  // namespace
}  // namespace vexa::test
