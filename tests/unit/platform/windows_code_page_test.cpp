#include <gtest/gtest.h>

#include <windows.h>

#include "platform/CodePage.h"

namespace vexa::platform {
namespace {

TEST(WindowsCodePage, IsTheMachinesOwnAndNotLatin1) {
    ASSERT_EQ(GetACP(), 1252U);
    EXPECT_EQ(inCodePage(L"10 \u20ac \u201cDe\u201d"),
              "10 \x80 \x93"
              "De\x94");
}

}  // namespace
}  // namespace vexa::platform
