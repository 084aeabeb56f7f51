#include <gtest/gtest.h>

#include "platform/Account.h"
#include "platform/CodePage.h"
#include "platform/DebugOutput.h"
#include "platform/Files.h"
#include "platform/KnownFolders.h"
#include "platform/NetworkAdapters.h"
#include "platform/Registry.h"
#include "unit/platform/MachineWorld.h"

namespace vexa::platform {
namespace {

class Machine : public ::testing::Test {
protected:
    test::MachineWorld world;
};

TEST_F(Machine, ItsAccountIsADomainAndAUser) {
    const auto name = accountName();
    ASSERT_TRUE(name);
    const std::size_t backslash = name->find(L'\\');
    ASSERT_NE(backslash, std::wstring::npos);
    EXPECT_GT(backslash, 0U);
    EXPECT_LT(backslash + 1, name->size());
    EXPECT_EQ(name->find(L'\0'), std::wstring::npos);
}

TEST_F(Machine, ADebuggerHearsOneTextForEachCall) {
    const std::string_view partOfAText = std::string_view("one and more").substr(0, 3);
    outputDebugString(partOfAText);
    outputDebugString(std::string_view("two\n"));
    outputDebugString(std::wstring_view(L"three"));
    EXPECT_EQ(world.debugLines(), (std::vector<std::string>{"one", "two", "three"}));
}

TEST_F(Machine, ACodePageHasAMarkForWhatItLacks) {
    EXPECT_EQ(inCodePage(L""), "");
    EXPECT_EQ(inCodePage(L"caf\u00e9 \u4e2d!"), "caf\xE9 ?!");
}

TEST_F(Machine, ThePublicFolderIsThereAndHasNoBackslashAtItsEnd) {
    const auto folder = publicFolder();
    ASSERT_TRUE(folder);
    EXPECT_EQ(folder->substr(1, 2), L":\\");
    EXPECT_NE(folder->back(), L'\\');
    EXPECT_TRUE(createFolder(*folder + L"\\vexa-contract"));
}

TEST_F(Machine, AdaptersAreListedWithTheirGuidsAndIndices) {
    constexpr std::uint32_t kBufferSize = 15000;
    AdapterList list = getAdaptersAddresses(kBufferSize);
    if (list.error == kErrorBufferOverflow) list = getAdaptersAddresses(list.neededSize);
    ASSERT_EQ(list.error, 0U);
    ASSERT_FALSE(list.adapters.empty());
    for (const AdapterAddresses& adapter : list.adapters) {
        EXPECT_EQ(adapter.name.size(), 38U) << adapter.name;
        EXPECT_TRUE(adapter.name.starts_with('{') && adapter.name.ends_with('}')) << adapter.name;
        EXPECT_NE(adapter.interfaceIndex, 0U);
        EXPECT_LE(adapter.physicalAddress.size(), 8U);
    }
    EXPECT_NE(getPerAdapterInfo(0x00FFFFFF, kBufferSize).error, 0U) << "an index that none has";
}

TEST_F(Machine, ARegistryKeyHoldsTheBytesOfItsNumbers) {
    constexpr const char* kPath = "Software\\Korvane\\Vexa Contract";
    constexpr std::size_t kEnough = 256;
    ASSERT_TRUE(writeRegistryNumber(kPath, "Number", 0x44434241));
    const auto key = RegistryKey::open(RegistryRoot::CurrentUser, kPath);
    ASSERT_TRUE(key);
    EXPECT_EQ(key->value("Number", kEnough), "ABCD");
    EXPECT_TRUE(key->value("Number", 5));
    EXPECT_FALSE(key->value("Number", 3)) << "it doesn't fit";
    ASSERT_TRUE(writeRegistryNumber(kPath, "Number", 0x00004241));
    EXPECT_EQ(key->value("Number", kEnough), "AB") << "up to the first NUL";
    const auto sameKey = RegistryKey::open(RegistryRoot::CurrentUser, "software\\KORVANE\\vexa contract");
    EXPECT_EQ(sameKey ? sameKey->value("NUMBER", kEnough) : "none", "AB") << "names have no case";
    EXPECT_FALSE(key->value("Another", kEnough));
    EXPECT_FALSE(key->wideValue("Another", kEnough));
    EXPECT_FALSE(key->subkeyName(0, kEnough));
    EXPECT_FALSE(RegistryKey::open(RegistryRoot::CurrentUser, "Software\\Korvane\\Nobody"));
    EXPECT_FALSE(RegistryKey::open(RegistryRoot::LocalMachine, "SOFTWARE\\Korvane\\Nobody"));
}

}  // namespace
}  // namespace vexa::platform
