#include <gtest/gtest.h>

#include "platform/PeerAccount.h"
#include "unit/platform/LocalConnection.h"

namespace vexa::platform {
namespace {

TEST(PeerAccount, KnowsOnlyConnectionsOfThisAccount) {
    const test::LocalConnection connection;
    const std::uint16_t client = connection.clientPort();
    const std::uint16_t server = connection.serverPort();
    EXPECT_TRUE(isPeerOfSameAccount(client, server));
    EXPECT_FALSE(isPeerOfSameAccount(server, server)) << "listens, and is no end of a connection";
    EXPECT_FALSE(isPeerOfSameAccount(client, client));
    EXPECT_FALSE(isPeerOfSameAccount(0, server));
}

TEST(PeerAccount, ForgetsAConnectionThatHasEnded) {
    std::uint16_t client = 0;
    std::uint16_t server = 0;
    {
        const test::LocalConnection connection;
        client = connection.clientPort();
        server = connection.serverPort();
        ASSERT_TRUE(isPeerOfSameAccount(client, server));
    }
    EXPECT_FALSE(isPeerOfSameAccount(client, server));
}

}  // namespace
}  // namespace vexa::platform
