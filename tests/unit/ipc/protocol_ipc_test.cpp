#include <gtest/gtest.h>
#include <sys/socket.h>
#include <sys/time.h>

#include <atomic>
#include <boost/asio/io_context.hpp>
#include <boost/asio/ip/tcp.hpp>
#include <boost/asio/write.hpp>
#include <boost/beast/core/buffers_to_string.hpp>
#include <boost/beast/core/flat_buffer.hpp>
#include <boost/beast/websocket.hpp>
#include <chrono>
#include <future>
#include <optional>
#include <string>
#include <thread>
#include <vector>

#include "channel/Ipc.h"
#include "channel/IpcWebSocketServer.h"

namespace vexa::test {
namespace {

namespace asio = boost::asio;
namespace beast = boost::beast;
using asio::ip::tcp;
using ClientId = IpcWebSocketServer::ClientId;

/// No wait of a test lasts longer; one that does is a failure.
constexpr std::chrono::seconds kPatience{20};

/// A port on which nothing listens.
std::int32_t freePort() {
    asio::io_context io;
    const tcp::acceptor acceptor(io, {asio::ip::address_v4::loopback(), 0});
    return acceptor.local_endpoint().port();
}

/// A WebSocket client that blocks, for as long as kPatience.
class TestClient {
public:
    explicit TestClient(std::int32_t port) {
        tcp::socket& socket = m_stream.next_layer();
        socket.connect({asio::ip::address_v4::loopback(), static_cast<std::uint16_t>(port)});
        const timeval limit{kPatience.count(), 0};
        for (const int option : {SO_RCVTIMEO, SO_SNDTIMEO})
            setsockopt(socket.native_handle(), SOL_SOCKET, option, &limit, sizeof limit);
        m_stream.handshake("localhost", "/");
    }

    void send(std::string_view message) {
        boost::system::error_code gone;
        m_stream.write(asio::buffer(message), gone);
    }

    /// The next message; nothing if the connection ended instead.
    std::optional<std::string> receive() {
        beast::flat_buffer buffer;
        boost::system::error_code error;
        m_stream.read(buffer, error);
        if (error) return std::nullopt;
        return beast::buffers_to_string(buffer.data());
    }

    /// The code with which the server closed; 0 if the connection just ended.
    std::uint16_t closeCode() const { return m_stream.reason().code; }

private:
    asio::io_context m_io;
    beast::websocket::stream<tcp::socket> m_stream{m_io};
};

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

}  // namespace
}  // namespace vexa::test
