#include <gtest/gtest.h>

#include <string>

#include "platform/Registry.h"
#include "platform/windows/Handle.h"

namespace vexa::platform {
namespace {

using Key = Owned<HKEY, &::RegCloseKey>;

constexpr const wchar_t* kPath = L"Software\\Korvane\\Vexa Registry Test";

class WindowsRegistry : public ::testing::Test {
protected:
    WindowsRegistry() {
        RegDeleteTreeW(HKEY_CURRENT_USER, kPath);
        EXPECT_EQ(RegCreateKeyExW(HKEY_CURRENT_USER, kPath, 0, nullptr, 0, KEY_ALL_ACCESS, nullptr,
                                  key.receive(), nullptr),
                  ERROR_SUCCESS);
    }
    ~WindowsRegistry() override { RegDeleteTreeW(HKEY_CURRENT_USER, kPath); }

    void set(const wchar_t* name, DWORD type, const std::wstring& text) const {
        EXPECT_EQ(RegSetValueExW(key.get(), name, 0, type, reinterpret_cast<const BYTE*>(text.c_str()),
                                 static_cast<DWORD>((text.size() + 1) * sizeof(wchar_t))),
                  ERROR_SUCCESS);
    }

    static RegistryKey opened() {
        return RegistryKey::open(RegistryRoot::CurrentUser, "Software\\Korvane\\Vexa Registry Test").value();
    }

    Key key;
};

TEST_F(WindowsRegistry, TextOfAnyTypeIsReadInBothWidths) {
    for (const DWORD type : {REG_SZ, REG_EXPAND_SZ}) {
        set(L"Text", type, L"PCI\\VEN_1F5D");
        EXPECT_EQ(opened().value("Text", 256), "PCI\\VEN_1F5D");
        EXPECT_EQ(opened().wideValue("Text", 260), L"PCI\\VEN_1F5D");
    }
}

TEST_F(WindowsRegistry, TheTerminatorHasToFitToo) {
    set(L"Text", REG_SZ, L"12345");
    EXPECT_FALSE(opened().value("Text", 5));
    EXPECT_EQ(opened().value("Text", 6), "12345");
    EXPECT_FALSE(opened().wideValue("Text", 10));
    EXPECT_EQ(opened().wideValue("Text", 12), L"12345");
}

TEST_F(WindowsRegistry, SubkeysComeByTheirIndexAsFarAsTheyFit) {
    for (const wchar_t* name : {L"0000", L"0001", L"Properties"})
        EXPECT_EQ(
            RegCreateKeyExW(key.get(), name, 0, nullptr, 0, KEY_READ, nullptr, Key().receive(), nullptr),
            ERROR_SUCCESS);
    EXPECT_EQ(opened().subkeyName(0, 256), "0000");
    EXPECT_EQ(opened().subkeyName(2, 256), "Properties");
    EXPECT_EQ(opened().subkeyName(2, 4), "");
    EXPECT_FALSE(opened().subkeyName(3, 256));
}

}  // namespace
}  // namespace vexa::platform
