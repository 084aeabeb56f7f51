#include <gtest/gtest.h>

#include "platform/Account.h"
#include "unit/platform/MachineWorld.h"

namespace vexa::platform {
namespace {

TEST(Account, IsADomainAndAUser) {
    const test::MachineWorld world;
    const auto name = accountName();
    ASSERT_TRUE(name);
    const std::size_t backslash = name->find(L'\\');
    ASSERT_NE(backslash, std::wstring::npos);
    EXPECT_GT(backslash, 0U);
    EXPECT_LT(backslash + 1, name->size());
    EXPECT_EQ(name->find(L'\0'), std::wstring::npos);
    EXPECT_EQ(accountName(), name);
}

}  // namespace
}  // namespace vexa::platform
