#include <gtest/gtest.h>

#include "platform/Files.h"
#include "platform/windows/Handle.h"
#include "unit/platform/MachineWorld.h"

namespace vexa::platform {
namespace {

Handle openSharing(const std::wstring& path, DWORD access, DWORD sharing) {
    return Handle(CreateFileW(path.c_str(), access, sharing, nullptr, OPEN_EXISTING, 0, nullptr));
}

TEST(WindowsFiles, AReaderWhoLetsNobodyDeleteIsWaitedForButNotForEver) {
    const test::MachineWorld world;
    const std::wstring target = world.folder() + L"\\target";
    ASSERT_TRUE(NewFile::create(target));
    auto draft = NewFile::create(world.folder() + L"\\draft");
    ASSERT_TRUE(draft && draft->write("new"));
    {
        const Handle reader = openSharing(target, GENERIC_READ, FILE_SHARE_READ);
        ASSERT_TRUE(reader);
        EXPECT_FALSE(draft->rename(target, Existing::Replace));
        EXPECT_EQ(readFile(target), "");
    }
    EXPECT_TRUE(draft->rename(target, Existing::Replace));
    EXPECT_EQ(readFile(target), "new");
}

TEST(WindowsFiles, AFileThatIsHeldCanBeReadByOthersAndWrittenByNone) {
    const test::MachineWorld world;
    const std::wstring path = world.folder() + L"\\held";
    const auto file = NewFile::create(path);
    ASSERT_TRUE(file);
    constexpr DWORD kAll = FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE;
    EXPECT_TRUE(openSharing(path, GENERIC_READ, kAll));
    EXPECT_FALSE(openSharing(path, GENERIC_WRITE, kAll));
}

}  // namespace
}  // namespace vexa::platform
