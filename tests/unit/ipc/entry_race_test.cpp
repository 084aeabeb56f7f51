#include <arpa/inet.h>
#include <gtest/gtest.h>
#include <netinet/in.h>
#include <sys/socket.h>
#include <unistd.h>

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "channel/IpcWebSocketServer.h"
#include "platform/posix/Descriptor.h"
#include "platform/posix/SocketOwner.h"
#include "unit/ipc/TestClient.h"

namespace {

using vexa::IpcWebSocketServer;
using vexa::posix::Descriptor;
using vexa::test::freePort;
using vexa::test::handshakeRequest;
using vexa::test::RawClient;

const std::string kMaskedText("\x81\x82\x00\x00\x00\x00{}", 8);

/// The request of a handshake with so many bytes.
std::string requestOf(std::size_t size) {
    const std::size_t least = handshakeRequest("localhost", "X: \r\n").size();
    return handshakeRequest("localhost", "X: " + std::string(size - least, 'x') + "\r\n");
}

TEST(IpcEntry, WhatComesBeforeTheAnswerIsNeverTaken) {
    std::atomic<int> handled{0};
    const std::int32_t port = freePort();
    const auto server =
        IpcWebSocketServer::create(port, [&](IpcWebSocketServer::ClientId, std::string_view) { ++handled; });
    for (const std::size_t size : {200U, 511U, 512U, 513U, 1024U, 1536U, 2048U, 4096U}) {
        SCOPED_TRACE(size);
        RawClient client(port);
        client.send(requestOf(size) + kMaskedText);
        EXPECT_EQ(client.receiveToEnd().substr(0, 12), "HTTP/1.1 403");
    }
    server->stop();
    EXPECT_EQ(handled, 0);
}

/// A connection of this process, and what becomes of the end that connected.
class Connection {
public:
    explicit Connection(int family) {
        sockaddr_in at{AF_INET, 0, {htonl(INADDR_LOOPBACK)}, {}};
        socklen_t size = sizeof at;
        listen(m_listener.get(), 1);
        getsockname(m_listener.get(), reinterpret_cast<sockaddr*>(&at), &size);
        m_serverPort = ntohs(at.sin_port);
        if (family == AF_INET6) {
            connectMapped();
        } else {
            connect(m_peer.get(), reinterpret_cast<sockaddr*>(&at), size);
        }
        m_accepted.reset(accept(m_listener.get(), reinterpret_cast<sockaddr*>(&at), &size));
        m_peerPort = ntohs(at.sin_port);
    }

    Descriptor& peer() { return m_peer; }
    std::uint16_t peerPort() const { return m_peerPort; }
    std::uint16_t serverPort() const { return m_serverPort; }

private:
    void connectMapped() {
        m_peer.reset(socket(AF_INET6, SOCK_STREAM, 0));
        sockaddr_in6 at{AF_INET6, htons(m_serverPort), 0, {}, 0};
        inet_pton(AF_INET6, "::ffff:127.0.0.1", &at.sin6_addr);
        connect(m_peer.get(), reinterpret_cast<sockaddr*>(&at), sizeof at);
    }

    static Descriptor listening() {
        Descriptor listener(socket(AF_INET, SOCK_STREAM, 0));
        const sockaddr_in at{AF_INET, 0, {htonl(INADDR_LOOPBACK)}, {}};
        bind(listener.get(), reinterpret_cast<const sockaddr*>(&at), sizeof at);
        return listener;
    }

    Descriptor m_listener{listening()};
    Descriptor m_peer{socket(AF_INET, SOCK_STREAM, 0)};
    Descriptor m_accepted;
    std::uint16_t m_peerPort = 0;
    std::uint16_t m_serverPort = 0;
};

TEST(IpcEntry, OnlyALiveSocketHasAnOwner) {
    const std::tuple<const char*, int, void (*)(Descriptor&), bool> cases[] = {
        {"alive", AF_INET, [](Descriptor&) {}, true},
        {"alive, of the other family", AF_INET6, [](Descriptor&) {}, true},
        {"left by its process", AF_INET, [](Descriptor& peer) { peer.reset(); }, false},
        {"left by its process, of the other family", AF_INET6, [](Descriptor& peer) { peer.reset(); }, false},
        {"ended", AF_INET, [](Descriptor& peer) { shutdown(peer.get(), SHUT_WR); }, false},
    };
    for (const auto& [name, family, change, isOwned] : cases) {
        SCOPED_TRACE(name);
        Connection connection(family);
        change(connection.peer());
        const auto expected = isOwned ? std::optional(geteuid()) : std::nullopt;
        const std::uint16_t peer = connection.peerPort();
        const std::uint16_t server = connection.serverPort();
        EXPECT_EQ(vexa::posix::SocketOwners().ownerOf(peer, server), expected);
        EXPECT_EQ(vexa::posix::socketOwnerInTable(peer, server), expected);
        EXPECT_EQ(vexa::posix::SocketOwners().ownerOf(server, server), std::nullopt) << "listens";
    }
}

}  // namespace
