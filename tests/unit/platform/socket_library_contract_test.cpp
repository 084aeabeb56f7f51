#include <gtest/gtest.h>

#include <optional>

#include "platform/SocketLibrary.h"
#include "unit/platform/LocalConnection.h"

namespace vexa::platform {
namespace {

constexpr std::uint16_t kVersion = 0x0202;

TEST(SocketLibrary, StaysUntilTheLastWhoTookItHasGivenItBack) {
    ASSERT_TRUE(startSocketLibrary(kVersion));
    ASSERT_TRUE(startSocketLibrary(kVersion));
    stopSocketLibrary();
    std::optional<test::LocalConnection> connection;
    EXPECT_NO_THROW(connection.emplace());
    connection.reset();
    stopSocketLibrary();
}

}  // namespace
}  // namespace vexa::platform
