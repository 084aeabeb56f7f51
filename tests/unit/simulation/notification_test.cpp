#include <gtest/gtest.h>

#include "Station.h"
#include "platform/Event.h"
#include "platform/Guid.h"
#include "platform/Thread.h"

namespace vexa::simulation {
namespace {

using platform::Event;
using platform::Reset;

/// A handler that stays in its first notification until it may leave.
class SlowListener : public Listener {
public:
    SlowListener() {
        onNotification = [this](const WLAN_NOTIFICATION_DATA&) {
            entered.set();
            leave.wait();
            hasLeft = true;
        };
    }

    Event entered{Reset::Manual};
    Event leave{Reset::Manual};
    std::atomic<bool> hasLeft{false};
};

TEST(Notifications, ComeToEveryHandlerInOrderWithExactlyTheirBytes) {
    TestMachine machine;
    Listener listener;
    Listener another;
    std::string nulls;
    listener.onNotification = [&](const WLAN_NOTIFICATION_DATA& data) {
        nulls += data.pData == nullptr && data.dwDataSize == 0 ? "0" : "1";
    };
    machine.perform("{'do': 'notify', 'source': 8, 'code': 9}");
    machine.perform("{'do': 'notify', 'source': 7, 'code': 4294967295, 'dataHex': 'Ff'}");
    machine.perform("{'do': 'ihv', 'dataHex': '0102', 'guid': '{00000001-0002-0003-0405-060708090a0B}'}");
    machine.perform("{'do': 'ihv', 'dataHex': ''}");
    const auto heard = listener.heard();
    ASSERT_EQ(listener.codes(), "8/9 7/4294967295 64/0 64/0");
    EXPECT_EQ(another.codes(), listener.codes());
    EXPECT_EQ(nulls, "0110");
    EXPECT_TRUE(areGuidsEqual(heard[0].guid, machine->adapters().guid(0)));
    EXPECT_EQ(heard[1].data, (Bytes{0xFF}));
    EXPECT_EQ(heard[2].data, (Bytes{1, 2}));
    EXPECT_TRUE(areGuidsEqual(heard[2].guid, {1, 2, 3, {4, 5, 6, 7, 8, 9, 10, 11}}));
}

TEST(Notifications, AreForWhoeverIsRegisteredWhenTheyArePostedUntilTheyAreUnregistered) {
    TestMachine machine;
    SlowListener slow;
    machine->notifications().post({8, 1, {}, {}, nullptr});
    slow.entered.wait();
    machine->notifications().post({8, 2, {}, {}, nullptr});
    Listener late;
    const Ticket last = machine->notifications().post({8, 3, {}, {}, nullptr});

    std::atomic<bool> hasLeftBefore{false};
    Event unregistering(Reset::Manual);
    platform::Thread thread;
    ASSERT_TRUE(thread.start("unregister", [&] {
        unregistering.set();
        WlanRegisterNotification(slow.handle(), 0, FALSE, nullptr, nullptr, nullptr, nullptr);
        hasLeftBefore = slow.hasLeft.load();
    }));
    unregistering.wait();
    machine.advance(0);  // all threads rest: the other one waits inside the call for the running handler
    EXPECT_FALSE(hasLeftBefore);
    slow.leave.set();
    thread.join();
    EXPECT_TRUE(hasLeftBefore);
    machine->notifications().waitDelivered(last);
    EXPECT_EQ(slow.codes(), "8/1");
    EXPECT_EQ(late.codes(), "8/3");
}

TEST(Notifications, AHandlerMayUnregisterItselfAndHearsWhatItAskedForAlone) {
    TestMachine machine;
    Listener listener;
    listener.onNotification = [&](const WLAN_NOTIFICATION_DATA&) {
        WlanRegisterNotification(listener.handle(), 0, FALSE, nullptr, nullptr, nullptr, nullptr);
    };
    const Listener other;
    DWORD previous = 0;
    const auto ignore = [](PWLAN_NOTIFICATION_DATA, PVOID) { ADD_FAILURE() << "not asked for"; };
    WlanRegisterNotification(other.handle(), WLAN_NOTIFICATION_SOURCE_ACM, FALSE, ignore, nullptr, nullptr,
                             &previous);
    EXPECT_EQ(previous, WLAN_NOTIFICATION_SOURCE_ALL);
    machine.perform("{'do': 'roam'}");
    EXPECT_EQ(listener.codes(), "16/5");
}

TEST(Notifications, StoppingReleasesWhoeverWaits) {
    TestMachine machine;
    machine->stop();
    machine.perform("{'do': 'roam'}");
}

}  // namespace
}  // namespace vexa::simulation
