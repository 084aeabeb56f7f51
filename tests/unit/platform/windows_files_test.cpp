#include <gtest/gtest.h>

#include <windows.h>
// After <windows.h>.
#include <aclapi.h>

#include "platform/Files.h"
#include "platform/windows/Handle.h"
#include "platform/windows/ProcessUser.h"
#include "text/TextConversion.h"
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

TEST(WindowsFiles, ALogIsForItsOwnerAndTheStoreForWhoeverLogsOn) {
    const test::MachineWorld world;
    const std::wstring log = world.folder() + L"\\log.txt";
    const std::wstring store = world.folder() + L"\\store";
    ASSERT_TRUE(appendToFile(narrowFromWide(log), "line\n"));
    ASSERT_TRUE(NewFile::create(store));
    const Storage user = userOf(GetCurrentProcess());
    for (const std::wstring& path : {log, store}) {
        Owned<PSECURITY_DESCRIPTOR, &::LocalFree> descriptor;
        PACL list = nullptr;
        ASSERT_EQ(GetNamedSecurityInfoW(path.c_str(), SE_FILE_OBJECT, DACL_SECURITY_INFORMATION, nullptr,
                                        nullptr, &list, nullptr, descriptor.receive()),
                  DWORD{ERROR_SUCCESS});
        ASSERT_NE(list, nullptr);
        for (DWORD i = 0; i < list->AceCount; ++i) {
            ACCESS_ALLOWED_ACE* entry = nullptr;
            ASSERT_NE(GetAce(list, i, reinterpret_cast<void**>(&entry)), 0);
            PSID const who = &entry->SidStart;
            EXPECT_TRUE(EqualSid(who, sidOf(user)) || IsWellKnownSid(who, WinLocalSystemSid) ||
                        IsWellKnownSid(who, WinBuiltinAdministratorsSid) ||
                        (path == store && IsWellKnownSid(who, WinInteractiveSid)))
                << "entry " << i;
        }
    }
    EXPECT_EQ(readFile(log), "line\r\n");
}

}  // namespace
}  // namespace vexa::platform
