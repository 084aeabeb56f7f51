#include <gtest/gtest.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <functional>
#include <future>
#include <string>
#include <thread>
#include <vector>

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

constexpr std::size_t kMebibyte = std::size_t{1} << 20;
// More than all buffers of two sockets hold.
constexpr std::size_t kMoreThanSockets = 24 * kMebibyte;

/// A frame as clients send it, with a mask of zeros.
std::string masked(unsigned char first, const std::string& payload) {
    const auto size = static_cast<char>(0x80 | payload.size());
    return std::string{static_cast<char>(first), size, 0, 0, 0, 0} + payload;
}

RawClient shakenHands(std::int32_t port) {
    RawClient client(port);
    client.send(handshakeRequest("localhost"));
    EXPECT_EQ(client.receiveHead().substr(0, 12), "HTTP/1.1 101");
    return client;
}

bool becomesTrue(const std::function<bool()>& condition) {
    constexpr std::chrono::milliseconds kPause(1);
    for (const auto end = Clock::now() + kPatience; Clock::now() < end; std::this_thread::sleep_for(kPause))
        if (condition()) return true;
    return false;
}

const std::pair<const char*, std::string> kEndings[] = {
    {"a close frame", masked(0x88, "\x03\xE8")},
    {"a close frame without a code", masked(0x88, "")},
    {"a close frame with half a code", masked(0x88, "\x03")},
    {"an unmasked frame", std::string("\x81\x02{}")},
    {"text that is no UTF-8", masked(0x81, "\xFF\xFE")},
    {"a message that is too long", std::string("\x81\xFF\0\0\0\0\x7F\xFF\xFF\xFF\0\0\0\0", 14)},
};

TEST(IpcEndings, WhoHasEndedForWebSocketIsNoClientAnyMoreAndSoonNoConnection) {
    const std::int32_t port = freePort();
    const auto server = IpcWebSocketServer::create(port, [](ClientId, std::string_view) {});
    for (const auto& [name, frame] : kEndings) {
        SCOPED_TRACE(name);
        RawClient client = shakenHands(port);
        ASSERT_TRUE(server->sendToAll("anybody?"));
        client.send(frame);
        EXPECT_NE(client.receiveToEnd().find('\x88'), std::string::npos) << "no goodbye";
        EXPECT_FALSE(server->sendToAll("anybody?"));
        EXPECT_FALSE(client.send("x")) << "only half of the connection has ended";
    }
}

TEST(IpcEndings, WhoDoesNotEvenReadHisGoodbyeGoesAsWell) {
    const std::string large(kMoreThanSockets, 'x');
    const std::int32_t port = freePort();
    const auto server = IpcWebSocketServer::create(port, [](ClientId, std::string_view) {});
    for (const auto& [name, frame] : kEndings) {
        SCOPED_TRACE(name);
        RawClient client = shakenHands(port);
        ASSERT_TRUE(server->sendToAll(large));
        client.send(frame);
        EXPECT_TRUE(becomesTrue([&] { return !server->sendToAll("anybody?"); }));
        EXPECT_TRUE(becomesTrue([&] { return !client.send("x"); })) << "still there";
    }
}

TEST(IpcEndings, OneMessageAloneCostsNobodyHisPlaceAndPingsDoNotPileUpBehindIt) {
    const std::string large(kMoreThanSockets, 'x');
    std::promise<void> handled;
    const std::int32_t port = freePort();
    const auto server =
        IpcWebSocketServer::create(port, [&](ClientId, std::string_view) { handled.set_value(); });
    RawClient client = shakenHands(port);
    ASSERT_TRUE(server->sendToAll(large));
    ASSERT_TRUE(server->sendToAll(std::string(kMoreThanSockets, 'y')));
    client.send(masked(0x89, "1") + masked(0x89, "2") + masked(0x81, "that was all"));
    ASSERT_EQ(handled.get_future().wait_for(kPatience), std::future_status::ready);
    EXPECT_EQ(client.receive(10 + large.size()).substr(10), large);
    EXPECT_EQ(client.receive(4), "\x8A\x01\x32\x81");
}

// An event that was sent while clients ask and ask counts how many of their messages are handled before it is
// with its reader.
TEST(IpcEndings, ARunOfShortCommandsHoldsUpNoEvent) {
    constexpr int kEvents = 101;
    std::atomic<int> handled{0};
    std::atomic<bool> isOver{false};
    const std::int32_t port = freePort();
    const auto server = IpcWebSocketServer::create(port, [&](ClientId, std::string_view) {
        for (const auto end = Clock::now() + std::chrono::microseconds(50); Clock::now() < end;) {
        }
        ++handled;
    });
    std::vector<std::future<void>> floods;
    for (int i = 0; i < 8; ++i)
        floods.push_back(std::async(std::launch::async, [&] {
            TestClient client(port);
            while (!isOver)
                client.send("and");
        }));
    TestClient reader(port);
    EXPECT_TRUE(becomesTrue([&] { return handled > 1000; }));
    std::vector<int> handledMeanwhile;
    for (int i = 0; i < kEvents; ++i) {
        const int before = handled;
        ASSERT_TRUE(server->sendToAll("event"));
        ASSERT_EQ(reader.receive(), "event");
        handledMeanwhile.push_back(handled - before);
    }
    isOver = true;
    for (auto& flood : floods)
        flood.get();
    std::nth_element(handledMeanwhile.begin(), handledMeanwhile.begin() + kEvents / 2,
                     handledMeanwhile.end());
    EXPECT_LT(handledMeanwhile[kEvents / 2], 100);
}

}  // namespace
