#include <gtest/gtest.h>

#include <algorithm>

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

    std::vector<std::wstring> names() const {
        auto found = filesIn(world.folder());
        std::sort(found.begin(), found.end());
        return found;
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

TEST_F(Files, ANewFileIsNoneThatExists) {
    put(L"there", "old");
    EXPECT_FALSE(NewFile::create(path(L"there")));
    EXPECT_FALSE(NewFile::create(path(L"no folder\\new")));
    EXPECT_EQ(readFile(path(L"there")), "old");
}

TEST_F(Files, OnlyWhatIsThereCanBeOpened) {
    EXPECT_FALSE(canOpenFile(path(L"nothing")));
    EXPECT_FALSE(readFile(path(L"nothing")));
    put(L"empty", "");
    EXPECT_TRUE(canOpenFile(path(L"empty")));
    EXPECT_EQ(readFile(path(L"empty")), "");
}

TEST_F(Files, ARenamedFileReplacesTheOldOneOrLeavesIt) {
    for (const Existing existing : {Existing::Replace, Existing::Keep}) {
        for (const bool hasOld : {true, false}) {
            const std::wstring target =
                L"target" + std::to_wstring(hasOld) + std::to_wstring(existing == Existing::Replace);
            if (hasOld) put(target, "old");
            auto file = NewFile::create(path(L"draft"));
            ASSERT_TRUE(file && file->write("new"));
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

TEST_F(Files, ARenameToAFolderThatIsNotThereFails) {
    auto file = NewFile::create(path(L"draft"));
    ASSERT_TRUE(file);
    EXPECT_FALSE(file->rename(path(L"no folder\\target"), Existing::Replace));
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

TEST_F(Files, AFolderListsItsFiles) {
    EXPECT_TRUE(names().empty());
    put(L"one", "");
    put(L"two \u00E4", "");
    EXPECT_EQ(names(), (std::vector<std::wstring>{L"one", L"two \u00E4"}));
    EXPECT_TRUE(filesIn(path(L"nothing")).empty());
}

TEST_F(Files, AFolderThatExistsIsAsGoodAsANewOne) {
    EXPECT_TRUE(createFolder(path(L"folder")));
    EXPECT_TRUE(createFolder(path(L"folder")));
    put(L"folder\\file", "in it");
    EXPECT_EQ(readFile(path(L"folder\\file")), "in it");
    EXPECT_FALSE(createFolder(path(L"folder\\file\\below")));
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
