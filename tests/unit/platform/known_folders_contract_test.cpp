#include <gtest/gtest.h>

#include "platform/Files.h"
#include "platform/KnownFolders.h"
#include "unit/platform/MachineWorld.h"

namespace vexa::platform {
namespace {

TEST(KnownFolders, ThePublicFolderIsThereAndHasNoBackslashAtItsEnd) {
    const test::MachineWorld world;
    const auto folder = publicFolder();
    ASSERT_TRUE(folder);
    EXPECT_EQ(folder->substr(1, 2), L":\\");
    EXPECT_NE(folder->back(), L'\\');
    const std::wstring below = *folder + L"\\vexa-contract";
    EXPECT_TRUE(createFolder(below));
    EXPECT_TRUE(createFolder(below)) << "it exists";
}

}  // namespace
}  // namespace vexa::platform
