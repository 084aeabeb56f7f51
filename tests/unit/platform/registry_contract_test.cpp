#include <gtest/gtest.h>

#include "platform/Registry.h"
#include "unit/platform/MachineWorld.h"

namespace vexa::platform {
namespace {

constexpr const char* kPath = "Software\\Korvane\\Vexa Contract";
constexpr std::size_t kEnough = 256;

std::optional<RegistryKey> contractKey() {
    return RegistryKey::open(RegistryRoot::CurrentUser, kPath);
}

TEST(Registry, AKeyThatIsNotThereCanNotBeOpened) {
    const test::MachineWorld world;
    EXPECT_FALSE(RegistryKey::open(RegistryRoot::CurrentUser, "Software\\Korvane\\Nobody"));
    EXPECT_FALSE(RegistryKey::open(RegistryRoot::LocalMachine, "SOFTWARE\\Korvane\\Nobody"));
}

TEST(Registry, ANumberIsWrittenAndReadAsItsBytes) {
    const test::MachineWorld world;
    ASSERT_TRUE(writeRegistryNumber(kPath, "Number", 0x44434241));
    const auto key = contractKey();
    ASSERT_TRUE(key);
    EXPECT_EQ(key->value("Number", kEnough), "ABCD");
    ASSERT_TRUE(writeRegistryNumber(kPath, "Number", 0x00004241));
    EXPECT_EQ(key->value("Number", kEnough), "AB") << "up to the first NUL";
}

TEST(Registry, AValueThatIsMissingIsNothing) {
    const test::MachineWorld world;
    ASSERT_TRUE(writeRegistryNumber(kPath, "Number", 1));
    const auto key = contractKey();
    ASSERT_TRUE(key);
    EXPECT_FALSE(key->value("Another", kEnough));
    EXPECT_FALSE(key->wideValue("Another", kEnough));
}

TEST(Registry, AValueThatDoesNotFitIsNothing) {
    const test::MachineWorld world;
    ASSERT_TRUE(writeRegistryNumber(kPath, "Number", 0x44434241));
    const auto key = contractKey();
    ASSERT_TRUE(key);
    EXPECT_FALSE(key->value("Number", 3));
    EXPECT_TRUE(key->value("Number", 5));
}

TEST(Registry, SubkeysEndSomewhere) {
    const test::MachineWorld world;
    ASSERT_TRUE(writeRegistryNumber(kPath, "Number", 1));
    const auto key = contractKey();
    ASSERT_TRUE(key);
    EXPECT_FALSE(key->subkeyName(0, kEnough));
}

}  // namespace
}  // namespace vexa::platform
