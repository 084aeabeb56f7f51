#include <gtest/gtest.h>

#include <algorithm>
#include <thread>

#include "platform/Files.h"
#include "text/TextConversion.h"
#include "unit/platform/MachineWorld.h"

namespace vexa::platform {
namespace {

class Files : public ::testing::Test {
protected:
    std::wstring path(const std::wstring& name) const { return world.folder() + L"\\" + name; }

    void put(const std::wstring& name, std::string_view content) const {
        auto file = NewFile::create(path(name));
        ASSERT_TRUE(file);
        ASSERT_TRUE(file->write(content));
    }

    test::MachineWorld world;
};

std::string withoutCarriageReturns(std::string text) {
    std::erase(text, '\r');
    return text;
}

TEST_F(Files, ANewFileHoldsTheBytesThatWereWritten) {
    std::string content("line\n\r\n\0\xFF tail", 14);
    content.append(200000, 'x');
    auto file = NewFile::create(path(L"new"));
    ASSERT_TRUE(file);
    EXPECT_TRUE(file->write(content));
    EXPECT_TRUE(file->write("!"));
    EXPECT_TRUE(file->flush());
    file.reset();
    EXPECT_EQ(readFile(path(L"new")), content + "!");
}

TEST_F(Files, OnlyWhatIsThereCanBeOpenedAndOnlyWhatIsNotBeMade) {
    EXPECT_FALSE(canOpenFile(path(L"file")));
    EXPECT_FALSE(readFile(path(L"file")));
    put(L"file", "");
    EXPECT_TRUE(canOpenFile(path(L"file")));
    EXPECT_EQ(readFile(path(L"file")), "");
    EXPECT_FALSE(NewFile::create(path(L"file")));
    EXPECT_FALSE(NewFile::create(path(L"no folder\\new")));
}

TEST_F(Files, ARenamedFileReplacesTheOldOneOrLeavesIt) {
    for (const Existing existing : {Existing::Replace, Existing::Keep}) {
        for (const bool hasOld : {true, false}) {
            const std::wstring target =
                L"target" + std::to_wstring(hasOld) + std::to_wstring(existing == Existing::Replace);
            if (hasOld) put(target, "old");
            auto file = NewFile::create(path(L"draft"));
            ASSERT_TRUE(file && file->write("new"));
            EXPECT_FALSE(file->rename(path(L"no folder\\target"), existing));
            const bool takesPlace = !hasOld || existing == Existing::Replace;
            EXPECT_EQ(file->rename(path(target), existing), takesPlace);
            EXPECT_EQ(canOpenFile(path(L"draft")), !takesPlace);
            file->remove();
            file.reset();
            EXPECT_EQ(readFile(path(target)), takesPlace ? "new" : "old");
            EXPECT_FALSE(canOpenFile(path(L"draft")));
        }
    }
}

TEST_F(Files, AFileIsAbandonedWhenNobodyHoldsIt) {
    auto file = NewFile::create(path(L"held"));
    ASSERT_TRUE(file);
    NewFile::removeIfAbandoned(path(L"held"));
    NewFile::removeIfAbandoned(path(L"nothing"));
    EXPECT_TRUE(canOpenFile(path(L"held")));
    NewFile moved = std::move(*file);
    file.reset();
    NewFile::removeIfAbandoned(path(L"held"));
    EXPECT_TRUE(canOpenFile(path(L"held")));
    { const NewFile last = std::move(moved); }
    NewFile::removeIfAbandoned(path(L"held"));
    EXPECT_FALSE(canOpenFile(path(L"held")));
}

TEST_F(Files, AFolderHasOneHolderAtATimeAndIsWaitedFor) {
    const auto take = [&](int limit) {
        return FolderLock::take(world.folder(), std::chrono::milliseconds(limit));
    };
    auto held = take(0);
    ASSERT_TRUE(held);
    EXPECT_FALSE(take(5));
    std::thread waiter([&] { EXPECT_TRUE(take(60000)); });
    held.reset();
    waiter.join();
    EXPECT_TRUE(take(0));
    EXPECT_TRUE(filesIn(world.folder()).empty());
    EXPECT_FALSE(FolderLock::take(path(L"no folder"), std::chrono::milliseconds(0)));
}

TEST_F(Files, AFolderListsItsFilesAndOneThatExistsIsAsGoodAsANewOne) {
    EXPECT_TRUE(filesIn(path(L"folder")).empty());
    EXPECT_TRUE(createFolder(path(L"folder")));
    EXPECT_TRUE(createFolder(path(L"folder")));
    EXPECT_TRUE(filesIn(path(L"folder")).empty());
    put(L"folder\\one", "");
    put(L"folder\\two \u00E4", "in it");
    EXPECT_EQ(readFile(path(L"folder\\two \u00E4")), "in it");
    auto found = filesIn(path(L"folder"));
    std::sort(found.begin(), found.end());
    EXPECT_EQ(found, (std::vector<std::wstring>{L"one", L"two \u00E4"}));
    EXPECT_FALSE(createFolder(path(L"folder\\one\\below")));
}

TEST_F(Files, TextIsAppendedToAFileThatIsMadeAtNeed) {
    const std::string narrow = narrowFromWide(path(L"log.txt"));
    EXPECT_TRUE(appendToFile(narrow, "one\n"));
    EXPECT_TRUE(appendToFile(narrow, ""));
    EXPECT_TRUE(appendToFile(narrow, "two\n"));
    EXPECT_EQ(withoutCarriageReturns(readFile(path(L"log.txt")).value_or("none")), "one\ntwo\n");
    EXPECT_FALSE(appendToFile(narrowFromWide(path(L"no folder\\log.txt")), "three\n"));
    EXPECT_FALSE(appendToFile("", "three\n"));
}

}  // namespace
}  // namespace vexa::platform
