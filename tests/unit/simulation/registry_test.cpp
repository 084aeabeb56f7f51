#include "platform/Registry.h"

#include <gtest/gtest.h>

#include "TestMachine.h"
#include "platform/posix/OwnerFiles.h"
#include "simulation/scenario/JsonText.h"

namespace vexa::simulation {
namespace {

using platform::RegistryKey;
using platform::RegistryRoot;

constexpr const char* kProductKey = "Software\\Korvane\\Vexa";

std::optional<RegistryKey> classKey(const std::string& below = "",
                                    RegistryRoot root = RegistryRoot::LocalMachine) {
    return RegistryKey::open(
        root, "system\\currentControlSet\\Control\\Class\\{4d36e972-E325-11CE-BFC1-08002BE10318}" + below);
}

class UsersRegistry : public ::testing::Test {
protected:
    std::filesystem::path file() { return machine->folder() / "registry.json"; }

    void put(const std::string& values) {
        ASSERT_TRUE(
            posix::replaceFile(file(), R"({"HKEY_CURRENT_USER\\Software\\Korvane\\Vexa":)" + values + "}"));
    }

    /// The values of the product's key, as they stand in the file.
    std::string values() {
        const Json::Value keys = machine.query("{'query': 'registry'}");
        EXPECT_EQ(keys.size(), 1U);
        return compactJson(keys["HKEY_CURRENT_USER\\Software\\Korvane\\Vexa"]);
    }

    TestMachine machine{"{'hotspotAutoConnect': '1'}"};
};

TEST(MachineRegistry, HasASubkeyForEachAdapterIfTheScenarioDoesNotSayOtherwise) {
    // Of each subkey its name, the interface and the hardware id.
    const std::pair<const char*, std::string> cases[] = {
        {"{'adapters': []}", ""},
        {"{'adapters': [{}, {'hardwareId': null, 'inserted': false}]}",
         "0000 {6B1E8A4C-5D2F-4E0B-9C37-1F5D00000001} pci\\ven_1f5d&dev_0101 "
         "0001 {6B1E8A4C-5D2F-4E0B-9C37-1F5D00000002} - "},
        {"{'registryClass': [{'netCfgInstanceId': null, 'matchingDeviceId': 'caf\xC3\xA9'}]}",
         "0000 - caf\xE9 "},
    };
    for (const auto& [scenario, expected] : cases) {
        const TestMachine machine(scenario);
        std::string found;
        for (std::uint32_t i = 0; const auto name = classKey().value().subkeyName(i, 5); ++i) {
            const auto key = classKey("\\" + *name).value();
            found += *name + " " + key.value("netcfginstanceid", 39).value_or("-") + " " +
                     key.value("MatchingDeviceId", 256).value_or("-") + " ";
        }
        EXPECT_EQ(found, expected) << scenario;
    }
}

TEST(MachineRegistry, GivesWhatFits) {
    const TestMachine machine;
    EXPECT_EQ(classKey().value().subkeyName(0, 4), "");
    EXPECT_EQ(classKey("\\0000").value().value("NetCfgInstanceId", 38), std::nullopt);
    EXPECT_FALSE(classKey("\\0001"));
    EXPECT_FALSE(classKey("", RegistryRoot::CurrentUser));
}

TEST_F(UsersRegistry, IsKeptInAFileOfTheOwner) {
    using std::filesystem::perms;
    EXPECT_EQ(std::filesystem::status(file()).permissions(), perms::owner_read | perms::owner_write);
    EXPECT_EQ(values(), R"({"IsHotSpotAutoConnect":"1"})");
    machine.perform("{'do': 'setRegistry', 'value': null}");
    EXPECT_EQ(values(), "{}");
    EXPECT_TRUE(platform::writeRegistryNumber(kProductKey, "EapMethod", 2));
    EXPECT_EQ(values(), R"({"EapMethod":2})");
    machine.perform("{'do': 'setRegistry', 'value': '0'}");
    EXPECT_TRUE(platform::writeRegistryNumber("software\\korvane\\vexa", "eapmethod", 0xFFFFFFFF));
    EXPECT_EQ(values(), R"({"EapMethod":4294967295,"IsHotSpotAutoConnect":"0"})");
    std::filesystem::remove(file());
    std::filesystem::create_directory(file());
    EXPECT_FALSE(platform::writeRegistryNumber(kProductKey, "EapMethod", 2))
        << "there is no place for a file";
}

TEST_F(UsersRegistry, IsReadAsOthersWroteIt) {
    put(R"({"EapMethod": 21, "Text": "a", "ishotspotautoconnect": "0"})");
    const auto key = RegistryKey::open(RegistryRoot::CurrentUser, "software\\korvane\\VEXA");
    ASSERT_TRUE(key);
    EXPECT_EQ(key->value("EapMethod", 5), "\x15");
    EXPECT_EQ(key->value("EapMethod", 4), std::nullopt);
    EXPECT_EQ(key->value("Text", 2), "a");
    machine.perform("{'do': 'setRegistry', 'value': 'true'}");
    EXPECT_EQ(values(), R"({"EapMethod":21,"IsHotSpotAutoConnect":"true","Text":"a"})");
}

}  // namespace
}  // namespace vexa::simulation
