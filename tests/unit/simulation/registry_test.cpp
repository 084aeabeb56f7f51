#include "platform/Registry.h"

#include <gtest/gtest.h>

#include "TestMachine.h"
#include "simulation/JsonText.h"
#include "simulation/OwnerFiles.h"

namespace vexa::simulation {
namespace {

using platform::RegistryKey;
using platform::RegistryRoot;

const std::string kClassKey =
    "system\\currentControlSet\\Control\\Class\\{4d36e972-E325-11CE-BFC1-08002BE10318}";

TEST(MachineRegistry, HasASubkeyForEachAdapter) {
    TestMachine machine("{'adapters': [{}, {'hardwareId': null, 'inserted': false}]}");
    const auto key = RegistryKey::open(RegistryRoot::LocalMachine, kClassKey);
    ASSERT_TRUE(key);
    EXPECT_EQ(key->subkeyName(0, 256), "0000");
    EXPECT_EQ(key->subkeyName(1, 256), "0001");
    EXPECT_EQ(key->subkeyName(1, 5), "0001");
    EXPECT_EQ(key->subkeyName(1, 4), "");
    EXPECT_EQ(key->subkeyName(2, 256), std::nullopt);
    const auto second = RegistryKey::open(RegistryRoot::LocalMachine, kClassKey + "\\0001");
    ASSERT_TRUE(second);
    EXPECT_EQ(second->value("netcfginstanceid", 256), "{6B1E8A4C-5D2F-4E0B-9C37-1F5D00000002}");
    EXPECT_EQ(second->value("NetCfgInstanceId", 39), "{6B1E8A4C-5D2F-4E0B-9C37-1F5D00000002}");
    EXPECT_EQ(second->value("NetCfgInstanceId", 38), std::nullopt);
    EXPECT_EQ(second->value("MatchingDeviceId", 256), std::nullopt);
    EXPECT_FALSE(RegistryKey::open(RegistryRoot::LocalMachine, kClassKey + "\\0002"));
    EXPECT_FALSE(RegistryKey::open(RegistryRoot::CurrentUser, kClassKey));
}

TEST(MachineRegistry, TheScenarioCanSayWhatTheClassKeyHolds) {
    TestMachine machine("{'registryClass': [{'netCfgInstanceId': null, 'matchingDeviceId': 'caf\xC3\xA9'}]}");
    const auto key = RegistryKey::open(RegistryRoot::LocalMachine, kClassKey + "\\0000");
    ASSERT_TRUE(key);
    EXPECT_EQ(key->value("NetCfgInstanceId", 256), std::nullopt);
    EXPECT_EQ(key->value("MatchingDeviceId", 256), "caf\xE9");
}

TEST(MachineRegistry, AnEmptyClassKeyIsStillThere) {
    TestMachine machine("{'adapters': []}");
    const auto key = RegistryKey::open(RegistryRoot::LocalMachine, kClassKey);
    ASSERT_TRUE(key);
    EXPECT_EQ(key->subkeyName(0, 256), std::nullopt);
}

TEST(MachineRegistry, TheUsersChoiceIsKeptInTheFile) {
    TestMachine machine("{'hotspotAutoConnect': '1'}");
    const auto file = machine->folder() / "registry.json";
    EXPECT_EQ(std::filesystem::status(file).permissions(),
              std::filesystem::perms::owner_read | std::filesystem::perms::owner_write);
    EXPECT_EQ(compactJson(machine.query("{'query': 'registry'}")),
              R"({"HKEY_CURRENT_USER\\Software\\Korvane\\Vexa":{"IsHotSpotAutoConnect":"1"}})");
    EXPECT_EQ(machine.ask("{'do': 'setRegistry', 'value': null}"), R"({"ok":true})");
    EXPECT_EQ(compactJson(machine.query("{'query': 'registry'}")),
              R"({"HKEY_CURRENT_USER\\Software\\Korvane\\Vexa":{}})");
}

TEST(MachineRegistry, ANumberIsANumberInTheFile) {
    TestMachine machine;
    const auto content = [&] { return compactJson(machine.query("{'query': 'registry'}")); };
    EXPECT_TRUE(platform::writeRegistryNumber("Software\\Korvane\\Vexa", "EapMethod", 2));
    EXPECT_EQ(content(), R"({"HKEY_CURRENT_USER\\Software\\Korvane\\Vexa":{"EapMethod":2}})");
    machine.ask("{'do': 'setRegistry', 'value': '0'}");
    EXPECT_TRUE(platform::writeRegistryNumber("software\\korvane\\vexa", "eapmethod", 0xFFFFFFFF));
    EXPECT_EQ(content(), R"({"HKEY_CURRENT_USER\\Software\\Korvane\\Vexa":{"EapMethod":4294967295,)"
                         R"("IsHotSpotAutoConnect":"0"}})");
    const auto key = RegistryKey::open(RegistryRoot::CurrentUser, "Software\\Korvane\\Vexa");
    ASSERT_TRUE(key);
    EXPECT_EQ(key->value("EapMethod", 5), "\xFF\xFF\xFF\xFF");
}

TEST(MachineRegistry, ANumberThatCanNotBeWrittenIsAFailure) {
    TestMachine machine;
    std::filesystem::create_directory(machine->folder() / "registry.json");
    EXPECT_FALSE(platform::writeRegistryNumber("Software\\Korvane\\Vexa", "EapMethod", 2));
}

TEST(MachineRegistry, ReadsWhatOthersWroteToTheFile) {
    TestMachine machine;
    EXPECT_FALSE(RegistryKey::open(RegistryRoot::CurrentUser, "Software\\Korvane\\Vexa"));
    ASSERT_TRUE(
        replaceFile(machine->folder() / "registry.json",
                    R"({"HKEY_CURRENT_USER\\Software\\Korvane\\Vexa": {"EapMethod": 21, "Text": "a"}})"));
    const auto key = RegistryKey::open(RegistryRoot::CurrentUser, "software\\korvane\\VEXA");
    ASSERT_TRUE(key);
    EXPECT_EQ(key->value("EapMethod", 256), "\x15");
    EXPECT_EQ(key->value("EapMethod", 4), std::nullopt);
    EXPECT_EQ(key->value("Text", 2), "a");
}

TEST(MachineRegistry, TheUsersChoiceIsFoundHoweverItsNameIsWritten) {
    const char* const none = R"({"HKEY_CURRENT_USER\\Software\\Korvane\\Vexa":{}})";
    for (const char* value : {"null", "'true'"}) {
        TestMachine machine;
        ASSERT_TRUE(
            replaceFile(machine->folder() / "registry.json",
                        R"({"HKEY_CURRENT_USER\\Software\\Korvane\\Vexa": {"ishotspotautoconnect": "0"}})"));
        machine.ask("{'do': 'setRegistry', 'value': " + std::string(value) + "}");
        machine.ask("{'do': 'setRegistry', 'value': null}");
        EXPECT_EQ(compactJson(machine.query("{'query': 'registry'}")), none) << value;
    }
}

}  // namespace
}  // namespace vexa::simulation
