#include <gtest/gtest.h>

#include "TestMachine.h"
#include "platform/ClockControl.h"
#include "platform/Thread.h"

namespace vexa::simulation {
namespace {

using platform::Event;
using platform::Reset;
using platform::Thread;

TEST(Notifications, ComeInOrderWithExactlyTheirBytes) {
    TestMachine machine;
    Listener listener;
    EXPECT_EQ(machine.ask("{'do': 'notify', 'source': 8, 'code': 9}"), R"({"ok":true})");
    EXPECT_EQ(machine.ask("{'do': 'notify', 'source': 7, 'code': 4294967295, 'dataHex': 'Ff'}"),
              R"({"ok":true})");
    EXPECT_EQ(
        machine.ask("{'do': 'ihv', 'dataHex': '0102', 'guid': '{00000001-0002-0003-0405-060708090A0B}'}"),
        R"({"ok":true})");
    const auto heard = listener.heard();
    ASSERT_EQ(listener.codes(), "8/9 7/4294967295 64/0");
    EXPECT_TRUE(heard[0].data.empty());
    EXPECT_EQ(heard[0].guid.Data1, 0x6B1E8A4CU);
    EXPECT_EQ(heard[1].data, (Bytes{0xFF}));
    EXPECT_EQ(heard[2].data, (Bytes{1, 2}));
    EXPECT_EQ(heard[2].guid.Data1, 1U);
}

TEST(Notifications, WithoutDataComeWithANullPointer) {
    TestMachine machine;
    Listener listener;
    bool sawNull = false;
    listener.onNotification = [&](const WLAN_NOTIFICATION_DATA& data) {
        sawNull = data.pData == nullptr && data.dwDataSize == 0;
    };
    machine.ask("{'do': 'ihv', 'dataHex': ''}");
    EXPECT_TRUE(sawNull);
}

TEST(Notifications, AnAnswerWaitsForEveryHandler) {
    TestMachine machine;
    Listener first;
    Listener second;
    machine.ask("{'do': 'roam'}");
    EXPECT_EQ(first.codes(), "16/5 16/6");
    EXPECT_EQ(second.codes(), "16/5 16/6");
}

TEST(Notifications, OnlyTheSourcesAskedForAreDelivered) {
    TestMachine machine;
    Listener listener;
    DWORD previous = 0;
    const auto ignore = [](PWLAN_NOTIFICATION_DATA, PVOID) { ADD_FAILURE() << "not asked for"; };
    WlanRegisterNotification(listener.handle(), WLAN_NOTIFICATION_SOURCE_ACM, FALSE, ignore, nullptr, nullptr,
                             &previous);
    EXPECT_EQ(previous, WLAN_NOTIFICATION_SOURCE_ALL);
    machine.ask("{'do': 'roam'}");
}

TEST(Notifications, PostedBeforeTheRegistrationAreDropped) {
    TestMachine machine;
    Listener slow;
    Event entered(Reset::Manual);
    Event leave(Reset::Manual);
    slow.onNotification = [&](const WLAN_NOTIFICATION_DATA&) {
        entered.set();
        leave.wait();
    };
    machine->notifications().post({8, 1, {}, {}, nullptr});
    entered.wait();
    machine->notifications().post({8, 2, {}, {}, nullptr});
    Listener late;
    const Ticket last = machine->notifications().post({8, 3, {}, {}, nullptr});
    leave.set();
    machine->notifications().waitDelivered(last);
    EXPECT_EQ(slow.codes(), "8/1 8/2 8/3");
    EXPECT_EQ(late.codes(), "8/3");
}

TEST(Notifications, UnregisteringWaitsForARunningHandler) {
    TestMachine machine;
    Listener listener;
    Event entered(Reset::Manual);
    Event leave(Reset::Manual);
    std::atomic<bool> left{false};
    listener.onNotification = [&](const WLAN_NOTIFICATION_DATA&) {
        entered.set();
        leave.wait();
        left = true;
    };
    machine->notifications().post({8, 1, {}, {}, nullptr});
    entered.wait();
    const Ticket second = machine->notifications().post({8, 2, {}, {}, nullptr});

    std::atomic<bool> leftBefore{false};
    Event unregistering(Reset::Manual);
    Thread thread;
    ASSERT_TRUE(thread.start("unregister", [&] {
        unregistering.set();
        WlanRegisterNotification(listener.handle(), 0, FALSE, nullptr, nullptr, nullptr, nullptr);
        leftBefore = left.load();
    }));
    unregistering.wait();
    machine.advance(0);  // all threads rest: the other one waits inside the call
    EXPECT_FALSE(leftBefore);
    leave.set();
    thread.join();
    EXPECT_TRUE(leftBefore);
    machine->notifications().waitDelivered(second);
    EXPECT_EQ(listener.codes(), "8/1");
}

TEST(Notifications, AHandlerMayUnregisterItself) {
    TestMachine machine;
    Listener listener;
    listener.onNotification = [&](const WLAN_NOTIFICATION_DATA&) {
        WlanRegisterNotification(listener.handle(), 0, FALSE, nullptr, nullptr, nullptr, nullptr);
    };
    EXPECT_EQ(machine.ask("{'do': 'roam'}"), R"({"ok":true})");
    EXPECT_EQ(listener.codes(), "16/5");
}

TEST(Notifications, AHandlerMayCallTheService) {
    TestMachine machine;
    Listener listener;
    DWORD interfaces = 99;
    listener.onNotification = [&](const WLAN_NOTIFICATION_DATA&) {
        PWLAN_INTERFACE_INFO_LIST list = nullptr;
        ASSERT_EQ(WlanEnumInterfaces(listener.handle(), nullptr, &list), ERROR_SUCCESS);
        interfaces = list->dwNumberOfItems;
        WlanFreeMemory(list);
    };
    machine.ask("{'do': 'pullAdapter'}");
    EXPECT_EQ(interfaces, 0U);
    machine.ask("{'do': 'insertAdapter'}");
    EXPECT_EQ(interfaces, 1U);
    EXPECT_EQ(listener.codes(), "8/14 8/13");
}

TEST(Notifications, StoppingReleasesWhoeverWaits) {
    TestMachine machine;
    machine->stop();
    EXPECT_EQ(machine.ask("{'do': 'roam'}"), R"({"ok":true})");
}

}  // namespace
}  // namespace vexa::simulation
