#include <gtest/gtest.h>

#include "platform/DebugOutput.h"
#include "unit/platform/MachineWorld.h"

namespace vexa::platform {
namespace {

TEST(DebugOutput, IsOneTextForEachCall) {
    test::MachineWorld world;
    const std::string_view partOfAText = std::string_view("one and more").substr(0, 3);
    outputDebugString(partOfAText);
    outputDebugString(std::string_view("two\n"));
    outputDebugString(std::wstring_view(L"three"));
    EXPECT_EQ(world.debugLines(), (std::vector<std::string>{"one", "two", "three"}));
}

}  // namespace
}  // namespace vexa::platform
