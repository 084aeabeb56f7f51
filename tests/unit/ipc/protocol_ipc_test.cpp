#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <future>
#include <memory>
#include <string>
#include <thread>
#include <vector>

#include "channel/Ipc.h"
#include "channel/IpcWebSocketServer.h"
#include "unit/ipc/TestClient.h"

namespace {

using vexa::IpcWebSocketServer;
using vexa::test::freePort;
using vexa::test::handshakeRequest;
using vexa::test::kPatience;
using vexa::test::RawClient;
using vexa::test::TestClient;
using ClientId = IpcWebSocketServer::ClientId;
using Clock = std::chrono::steady_clock;

/// A gate that a handler waits at until the test opens it.
class Gate {
public:
    void open() { m_promise.set_value(); }
    bool wait() { return m_future.wait_for(kPatience) == std::future_status::ready; }

private:
    std::promise<void> m_promise;
    std::shared_future<void> m_future{m_promise.get_future().share()};
};

struct Server {
    explicit Server(const IpcWebSocketServer::Handler& handler)
        : port(freePort()), ipc(IpcWebSocketServer::create(port, handler)) {}

    std::int32_t port;
    std::shared_ptr<IpcWebSocketServer> ipc;
};

/// Answers every message with itself.
struct EchoServer {
    EchoServer() { ipc.set_value(server.ipc.get()); }

    std::promise<IpcWebSocketServer*> ipc;
    Server server{[future = ipc.get_future().share()](ClientId client, std::string_view message) {
        future.get()->sendTo(client, std::string(message));
    }};
    std::int32_t port = server.port;
};

std::string numbered(int number) {
    return "message " + std::to_string(number);
}

TEST(Ipc, AMessageGoesToAllClientsAndAnAnswerToItsOwn) {
    EchoServer echo;
    TestClient first(echo.port);
    TestClient second(echo.port);
    first.send("for me");
    EXPECT_EQ(first.receive(), "for me");
    EXPECT_TRUE(echo.server.ipc->sendToAll("for all"));
    EXPECT_EQ(first.receive(), "for all");
    EXPECT_EQ(second.receive(), "for all");
}

TEST(Ipc, WhoHasShakenHandsMissesNothing) {
    Server server([](ClientId, std::string_view) {});
    for (int i = 0; i < 200; ++i) {
        TestClient client(server.port);
        ASSERT_TRUE(server.ipc->sendToAll(numbered(i)));
        ASSERT_EQ(client.receive(), numbered(i));
    }
}

TEST(Ipc, ManyMessagesInOneRushAreHandledInOrderAndNoneIsLost) {
    constexpr int kCount = 20'000;
    EchoServer echo;
    TestClient client(echo.port);
    auto sending = std::async(std::launch::async, [&] {
        for (int i = 0; i < kCount; ++i)
            client.send(numbered(i));
    });
    for (int i = 0; i < kCount; ++i)
        ASSERT_EQ(client.receive(), numbered(i));
    sending.get();
}

TEST(Ipc, ASlowHandlerHoldsUpNeitherWhatItSentNorOthers) {
    Gate gate;
    std::promise<IpcWebSocketServer*> ipc;
    Server server([&gate, future = ipc.get_future().share()](ClientId client, std::string_view) {
        future.get()->sendTo(client, "before");
        future.get()->sendToAll("also before");
        EXPECT_TRUE(gate.wait());
    });
    ipc.set_value(server.ipc.get());
    TestClient asking(server.port);
    asking.send("go");
    EXPECT_EQ(asking.receive(), "before");
    EXPECT_EQ(asking.receive(), "also before");
    for (int i = 0; i < 100; ++i) {
        TestClient other(server.port);
        other.send("queued behind the handler");
        ASSERT_TRUE(server.ipc->sendToAll(numbered(i)));
        ASSERT_EQ(other.receive(), numbered(i));
        ASSERT_EQ(asking.receive(), numbered(i));
    }
    gate.open();
    server.ipc->stop();
}

TEST(Ipc, AClientFarAheadOfASlowHandlerGoesOnWhenItDoes) {
    constexpr int kCount = 2'000;
    Gate gate;
    std::atomic<int> handled{0};
    std::promise<void> all;
    Server server([&](ClientId, std::string_view) {
        EXPECT_TRUE(gate.wait());
        if (++handled == kCount) all.set_value();
    });
    TestClient client(server.port);
    for (int i = 0; i < kCount; ++i)
        client.send(numbered(i));
    EXPECT_EQ(handled, 0);
    gate.open();
    EXPECT_EQ(all.get_future().wait_for(kPatience), std::future_status::ready) << handled << " handled";
    server.ipc->stop();
}

TEST(Ipc, AClientWhoNeverReadsIsDroppedAndTheOthersDoNotNotice) {
    const std::string block(100'000, 'x');
    Server server([](ClientId, std::string_view) {});
    TestClient stuck(server.port);
    TestClient reader(server.port);
    for (int i = 0; i < 200; ++i) {
        ASSERT_TRUE(server.ipc->sendToAll(block));
        ASSERT_EQ(reader.receive(), block);
    }
    while (stuck.receive()) {
    }
    EXPECT_EQ(stuck.closeCode(), 1008);
}

TEST(Ipc, TheLargestMessageComesInAndALargerOneClosesTheConnection) {
    EchoServer echo;
    TestClient client(echo.port);
    TestClient other(echo.port);
    const std::string largest(IpcWebSocketServer::kMaxMessage, 'x');
    client.send(largest);
    EXPECT_EQ(client.receive(), largest);
    client.send(largest + "x");
    EXPECT_EQ(client.receive(), std::nullopt);
    EXPECT_EQ(client.closeCode(), 1009);
    other.send("still here");
    EXPECT_EQ(other.receive(), "still here");
}

struct Entry {
    const char* name;
    std::string request;
    const char* status;
};

TEST(Ipc, OnlyALoopbackHostWithoutAnOriginGetsIn) {
    EchoServer echo;
    const Entry entries[] = {
        {"name", handshakeRequest("localhost"), "101"},
        {"name and port", handshakeRequest("LOCALHOST:80"), "101"},
        {"address", handshakeRequest("127.0.0.1:1"), "101"},
        {"IPv6 address", handshakeRequest("[::1]:1"), "101"},
        {"foreign", handshakeRequest("vexa.example"), "403"},
        {"begins alike", handshakeRequest("localhost.example"), "403"},
        {"begins alike, as an address", handshakeRequest("127.0.0.1.example"), "403"},
        {"more behind the address", handshakeRequest("[::1].example"), "403"},
        {"empty", handshakeRequest(""), "403"},
        {"two hosts", handshakeRequest("localhost", "Host: localhost\r\n"), "403"},
        {"origin", handshakeRequest("localhost", "Origin: http://localhost\r\n"), "403"},
        {"no upgrade", "GET / HTTP/1.1\r\nHost: localhost\r\n\r\n", "403"},
        {"garbage", "\x16\x03\x01 hello\r\n\r\n", "403"},
        {"frames before the answer", handshakeRequest("localhost") + "\x81\x80", "403"},
        {"endless header", handshakeRequest("localhost", "X: " + std::string(100'000, 'x') + "\r\n"), "403"},
    };
    for (const Entry& entry : entries) {
        SCOPED_TRACE(entry.name);
        RawClient client(echo.port);
        client.send(entry.request);
        EXPECT_EQ(client.receiveHead().substr(0, 12), std::string("HTTP/1.1 ") + entry.status);
    }
}

TEST(Ipc, AHandshakeThatComesByteByByteIsAsGoodAsAnother) {
    EchoServer echo;
    RawClient client(echo.port);
    for (const char byte : handshakeRequest("localhost"))
        ASSERT_TRUE(client.send({&byte, 1}));
    EXPECT_EQ(client.receiveHead().substr(0, 12), "HTTP/1.1 101");
}

TEST(Ipc, AClientThatOnlyEndsItsHalfIsLetGo) {
    EchoServer echo;
    RawClient client(echo.port);
    client.send(handshakeRequest("localhost"));
    EXPECT_NE(client.receiveHead(), "");
    client.endSending();
    EXPECT_EQ(client.receiveToEnd(), "");
    EXPECT_FALSE(echo.server.ipc->sendToAll("anybody?"));
}

TEST(Ipc, StopIsQuickWhateverTheClientsDo) {
    Server server([](ClientId, std::string_view) {});
    const RawClient silent(server.port);
    RawClient half(server.port);
    half.send("GET / HTTP/1.1\r\n");
    const TestClient deaf(server.port);
    std::vector<TestClient> idle;
    for (int i = 0; i < 20; ++i)
        idle.emplace_back(server.port);
    for (int i = 0; i < 30; ++i)
        server.ipc->sendToAll(std::string(100'000, 'x'));
    const auto begin = Clock::now();
    server.ipc->stop();
    EXPECT_LT(Clock::now() - begin, std::chrono::seconds(5));
    EXPECT_FALSE(server.ipc->sendToAll("too late"));
}

TEST(Ipc, StopStillSendsWhatIsQueuedAndTellsTheClients) {
    Server server([](ClientId, std::string_view) {});
    TestClient client(server.port);
    for (int i = 0; i < 100; ++i)
        server.ipc->sendToAll(numbered(i));
    auto heard = std::async(std::launch::async, [&] {
        int count = 0;
        while (client.receive() == numbered(count))
            ++count;
        return count;
    });
    server.ipc->stop();
    EXPECT_EQ(heard.get(), 100);
    EXPECT_EQ(client.closeCode(), 1001);
}

TEST(Ipc, StopReturnsAfterTheLastCallOfTheHandler) {
    Gate entered;
    Gate gate;
    std::atomic<bool> hasEnded{false};
    Server server([&](ClientId, std::string_view) {
        entered.open();
        EXPECT_TRUE(gate.wait());
        hasEnded = true;
    });
    TestClient client(server.port);
    client.send("go");
    client.send("never handled");
    ASSERT_TRUE(entered.wait());
    auto stopping = std::async(std::launch::async, [&] {
        server.ipc->stop();
        return hasEnded.load();
    });
    EXPECT_EQ(client.receive(), std::nullopt);
    gate.open();
    EXPECT_TRUE(stopping.get());
}

TEST(Ipc, APortThatCannotBeHadGivesNoHandle) {
    const auto ignore = [](const char*, std::uint32_t, void*) {};
    const Server owner([](ClientId, std::string_view) {});
    for (const std::int32_t port : {0, -1, 65536, owner.port})
        EXPECT_EQ(vexa::IpcCreateServer(1, 0, ignore, nullptr, port), 0U) << "port " << port;
}

TEST(Ipc, AServerGetsItsPortBackAtOnceAfterItHadClients) {
    Server server([](ClientId, std::string_view) {});
    TestClient client(server.port);
    auto farewell = std::async(std::launch::async, [&] { return client.receive(); });
    server.ipc->stop();
    EXPECT_EQ(farewell.get(), std::nullopt);
    EXPECT_NE(IpcWebSocketServer::create(server.port, [](ClientId, std::string_view) {}), nullptr);
}

TEST(Ipc, AClosedHandleTakesNothing) {
    const auto ignore = [](const char*, std::uint32_t, void*) {};
    const std::int32_t port = freePort();
    const vexa::IpcHandle handle = vexa::IpcCreateServer(1, 0, ignore, nullptr, port);
    ASSERT_NE(handle, 0U);
    EXPECT_EQ(vexa::IpcSend(handle, "x", 1), 0U);
    TestClient client(port);
    EXPECT_EQ(vexa::IpcSend(handle, "x", 1), 1U);
    EXPECT_EQ(client.receive(), "x");
    vexa::IpcClose(handle);
    EXPECT_EQ(vexa::IpcSend(handle, "x", 1), 0U);
    EXPECT_EQ(vexa::IpcSend(0, "x", 1), 0U);
    vexa::IpcClose(handle);
}

TEST(Ipc, SendersOnManyThreadsAndClientsThatComeAndGoDoNoHarm) {
    EchoServer echo;
    std::vector<std::future<void>> senders;
    for (int i = 0; i < 3; ++i)
        senders.push_back(std::async(std::launch::async, [&] {
            for (int j = 0; j < 5'000; ++j)
                echo.server.ipc->sendToAll("noise");
        }));
    for (int i = 0; i < 40; ++i) {
        TestClient client(echo.port);
        client.send("mine");
        auto message = client.receive();
        while (message == "noise")
            message = client.receive();
        EXPECT_EQ(message, "mine");
    }
    for (auto& sender : senders)
        sender.get();
}

}  // namespace
