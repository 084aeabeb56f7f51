#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <future>
#include <optional>
#include <string>
#include <thread>
#include <vector>

#include "channel/Ipc.h"
#include "channel/IpcWebSocketServer.h"
#include "unit/ipc/TestClient.h"
#include "unit/platform/ShortMemory.h"

namespace vexa::test {
namespace {

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

TEST(Ipc, AClientFarAheadOfASlowHandlerWaitsInHisSocketAndGoesOnWhenItDoes) {
    constexpr int kCount = 256;
    const std::string frame = std::string("\x82\xFE\xFF\xFF\0\0\0\0", 8) + std::string(0xFFFF, 'x');
    std::string rush;  // more than the sockets hold
    for (int i = 0; i < kCount; ++i)
        rush += frame;
    Gate gate;
    std::atomic<int> handled{0};
    std::promise<void> all;
    Server server([&](ClientId, std::string_view) {
        EXPECT_TRUE(gate.wait());
        if (++handled == kCount) all.set_value();
    });
    RawClient client(server.port);
    client.send(handshakeRequest("localhost"));
    client.receiveHead();
    TestClient other(server.port);
    auto flood = std::async(std::launch::async, [&] { return client.send(rush); });
    for (int i = 0; i < 2'000; ++i) {
        ASSERT_TRUE(server.ipc->sendToAll(numbered(i)));
        ASSERT_EQ(other.receive(), numbered(i));
    }
    EXPECT_EQ(flood.wait_for(std::chrono::seconds(0)), std::future_status::timeout) << "all is in the server";
    EXPECT_EQ(handled, 0);
    gate.open();
    EXPECT_EQ(all.get_future().wait_for(kPatience), std::future_status::ready) << handled << " handled";
    EXPECT_TRUE(flood.get());
    server.ipc->stop();
}

TEST(Ipc, WhoSaysGoodbyeBehindACommandLeavesWhileItIsHandled) {
    Gate gate;
    Server server([&gate](ClientId, std::string_view) { EXPECT_TRUE(gate.wait()); });
    RawClient hasty(server.port);
    hasty.send(handshakeRequest("localhost"));
    hasty.receiveHead();
    hasty.send(std::string("\x81\x82\0\0\0\0go\x88\x80\0\0\0\0", 14));
    EXPECT_EQ(hasty.receiveToEnd(), "\x88\x02\x03\xE8");
    gate.open();
    server.ipc->stop();
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

// The first answer goes at once, the second with those that are ready within a millisecond: of most rushes
// few, whatever else the processor has to do.
TEST(Ipc, AnAnswerWaitsForThoseOfCommandsBehindItButNotLong) {
    constexpr int kCount = 200;
    std::string commands;
    for (int i = 0; i < kCount; ++i)
        commands += std::string("\x81\x80\0\0\0\0", 6);
    std::atomic<int> handled{0};
    std::promise<IpcWebSocketServer*> ipc;
    const Server server([&, future = ipc.get_future().share()](ClientId client, std::string_view) {
        for (const auto end = Clock::now() + std::chrono::microseconds(500); Clock::now() < end;) {
        }
        ++handled;
        future.get()->sendTo(client, "");
    });
    ipc.set_value(server.ipc.get());
    RawClient client(server.port);
    client.send(handshakeRequest("localhost"));
    client.receiveHead();
    int quickRushes = 0;
    for (int rush = 0; rush < 7; ++rush) {
        handled = 0;
        client.send(commands);
        ASSERT_EQ(client.receive(4), std::string("\x81\0\x81\0", 4));
        if (handled < kCount / 10) ++quickRushes;
        ASSERT_EQ(client.receive(2 * kCount - 4).size(), std::size_t{2 * kCount - 4});
    }
    EXPECT_GT(quickRushes, 2);
}

// But for a thread that happens to stand still for some milliseconds.
TEST(Ipc, WhoLeavesRightBehindHisCommandsStillGetsTheirAnswers) {
    const std::string commands("\x81\x81\0\0\0\0a\x81\x81\0\0\0\0b\x81\x81\0\0\0\0c", 21);
    const std::string answers = "\x81\1a\x81\1b\x81\1c";
    const std::string goodbye("\x88\x80\0\0\0\0", 6);
    EchoServer echo;
    int heard = 0;
    for (int i = 0; i < 10; ++i) {
        RawClient polite(echo.port);
        RawClient curt(echo.port);
        for (RawClient* client : {&polite, &curt}) {
            client->send(handshakeRequest("localhost"));
            client->receiveHead();
        }
        polite.send(commands + goodbye);
        if (polite.receiveToEnd() == answers + "\x88\2\3\xE8") ++heard;
        curt.send(commands);
        curt.endSending();
        if (curt.receiveToEnd() == answers) ++heard;
    }
    EXPECT_GT(heard, 15);
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
        EXPECT_EQ(IpcCreateServer(1, 0, ignore, nullptr, port), 0U) << "port " << port;
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
    const IpcHandle handle = IpcCreateServer(1, 0, ignore, nullptr, port);
    ASSERT_NE(handle, 0U);
    EXPECT_EQ(IpcSend(handle, "x", 1), 0U);
    TestClient client(port);
    EXPECT_EQ(IpcSend(handle, "x", 1), 1U);
    EXPECT_EQ(client.receive(), "x");
    IpcClose(handle);
    EXPECT_EQ(IpcSend(handle, "x", 1), 0U);
    EXPECT_EQ(IpcSend(0, "x", 1), 0U);
    IpcClose(handle);
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
    const auto end = std::chrono::steady_clock::now() + kPatience;
    while (echo.server.ipc->sendToAll("anybody?") && std::chrono::steady_clock::now() < end)
        std::this_thread::yield();
    EXPECT_FALSE(echo.server.ipc->sendToAll("anybody?")) << "all have gone";
}

std::thread::id g_testThread;

bool isServersThread() {
    return std::this_thread::get_id() != g_testThread;
}

/// Nothing if the connection ended before.
std::optional<std::string> answer(std::int32_t port, std::string_view message) {
    try {
        TestClient client(port);
        client.send(message);
        return client.receive();
    } catch (const std::exception&) {
        return std::nullopt;
    }
}

TEST(Ipc, WhereMemoryRunsOutClientsAreDroppedAndMayComeBack) {
    EchoServer echo;
    g_testThread = std::this_thread::get_id();
    bool wasShort = true;
    for (int granted = 0; wasShort; ++granted) {
        {
            const ShortMemory memory(isServersThread, granted, false);
            answer(echo.port, "while it is short");
            wasShort = memory.hasRefused();
        }
        std::optional<std::string> later;
        for (int tries = 0; !later && tries < 1000; ++tries)
            later = answer(echo.port, "later");
        ASSERT_EQ(later, "later") << granted;
    }
}

}  // namespace
}  // namespace vexa::test
