#include "config/SafeSave.h"

#include <gtest/gtest.h>
#include <sys/file.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <cstdio>
#include <filesystem>
#include <functional>
#include <regex>
#include <utility>

#include "platform/Files.h"
#include "platform/KnownFolders.h"
#include "text/TextConversion.h"
#include "unit/config/StoreMachine.h"

namespace {

/// Hears of the calls below before they are made.
std::function<void(const std::string& call)> g_listener;

std::string nameOf(const std::string& path) {
    return std::filesystem::path(path).filename().string();
}

std::string nameOf(int file) {
    return nameOf(std::filesystem::read_symlink("/proc/self/fd/" + std::to_string(file)).string());
}

void tell(const std::string& call) {
    if (g_listener) g_listener(call);
}

}  // namespace

// In place of the C library's.
extern "C" int fsync(int file) {
    tell("flush " + nameOf(file));
    return static_cast<int>(::syscall(SYS_fsync, file));
}

extern "C" int flock(int file, int operation) noexcept {
    tell("lock " + nameOf(file));
    return static_cast<int>(::syscall(SYS_flock, file, operation));
}

extern "C" int rename(const char* from, const char* to) noexcept {
    tell("rename " + nameOf(std::string(from)) + " to " + nameOf(std::string(to)));
    return static_cast<int>(::syscall(SYS_rename, from, to));
}

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

TEST(SafeSave, FlushesTheFileBeforeItsNewNameAndItsNameBehindIt) {
    StoreMachine store;
    std::string calls;
    const std::regex digits("[0-9a-f]{16}");
    g_listener = [&](const std::string& call) { calls += std::regex_replace(call, digits, "*") + ", "; };
    EXPECT_TRUE(saveSafely(pathOf(L"f"), "new"));
    EXPECT_EQ(std::exchange(calls, ""), "lock f.*.tmp, flush f.*.tmp, rename f.*.tmp to f, flush Korvane, ");
    EXPECT_TRUE(saveSafely(pathOf(L"g"), "new", platform::Existing::Keep));
    EXPECT_EQ(calls, "lock g.*.tmp, flush g.*.tmp, flush Korvane, ");
    g_listener = nullptr;
}

// Between the making of a temporary and its lock another process takes it for a leftover.
TEST(SafeSave, MakesAnotherTemporaryWhereOneIsTakenAway) {
    StoreMachine store;
    int taken = 0;
    g_listener = [&](const std::string& call) {
        if (!call.starts_with("lock ") || ++taken > 3) return;
        const auto listener = std::exchange(g_listener, nullptr);
        platform::NewFile::removeIfAbandoned(pathOf(wideFromNarrow(call.substr(5)).c_str()));
        g_listener = listener;
    };
    EXPECT_TRUE(saveSafely(pathOf(L"f"), "new"));
    g_listener = nullptr;
    EXPECT_EQ(store.read("f"), "new");
    EXPECT_EQ(store.listing(), "f");
    EXPECT_EQ(taken, 4);
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

// Whether a call on the disk fails, or the opening of the file: to see that it is there, to read what others
// changed, where that failed once more for the save, and to write the new one.
TEST(SafeSave, AFaultAtAnyPointCostsNothingBehindTheNextSave) {
    struct Fault {
        std::string call;
        int skip = 0;
        int times = 1;
        bool isReadInVain = false;
    };
    const Fault faults[] = {{"write"},   {"sync"},    {"rename"},           {"open"},
                            {"open", 1}, {"open", 2}, {"open", 0, 2, true}, {"open", 1, 2, true}};
    for (const auto& [call, skip, times, isReadInVain] : faults) {
        SCOPED_TRACE(call + std::to_string(skip) + " " + std::to_string(times));
        StoreMachine store;
        ASSERT_EQ(open(store.config()), kSuccess);
        EXPECT_EQ(store.add(L"a"), kSuccess);
        const std::string before = store.file();
        store.fail(call, skip, times);
        EXPECT_EQ(store.add(L"b"), isReadInVain ? kFailure : kSuccess);
        EXPECT_EQ(store.file() == before, isReadInVain || call != "open");
        EXPECT_EQ(store.listing(), "Dump config.xml");
        EXPECT_EQ(store.add(L"c"), kSuccess);
        Config reader;
        ASSERT_EQ(open(reader), kSuccess);
        EXPECT_EQ(places(reader.credentials()), "3:1 2:2 1:3");
        EXPECT_EQ(reader.nextCredId(), 4);
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
