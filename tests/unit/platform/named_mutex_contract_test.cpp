#include <gtest/gtest.h>

#include <atomic>
#include <memory>

#include "platform/ClockControl.h"
#include "platform/NamedMutex.h"
#include "platform/Thread.h"
#include "unit/platform/World.h"

namespace vexa::platform {
namespace {

using namespace std::chrono_literals;
using Owner = NamedMutex::Owner;

// A thread that owns it may own it twice on some machines.
bool canBeTaken(const char* name) {
    bool isTaken = false;
    Thread other;
    other.start("other", [&] { isTaken = NamedMutex(name, Owner::Yes).isOwned(); });
    other.join();
    return isTaken;
}

IN_WORLD(NamedMutex, ExistsWhileSomebodyHasItOpen) {
    {
        const NamedMutex first("{existence}", Owner::No);
        EXPECT_TRUE(first.isValid());
        EXPECT_FALSE(first.existedBefore());
        EXPECT_TRUE(NamedMutex("{existence}", Owner::No).existedBefore());
        EXPECT_FALSE(NamedMutex("{another}", Owner::No).existedBefore());
    }
    EXPECT_FALSE(NamedMutex("{existence}", Owner::No).existedBefore());
}

IN_WORLD(NamedMutex, OwnershipIsTakenOnlyByWhoWantsItAndIfNobodyHasIt) {
    NamedMutex mutex("{ownership}", Owner::No);
    EXPECT_FALSE(mutex.isOwned());
    mutex.wait();
    EXPECT_TRUE(mutex.isOwned());
    NamedMutex second("{ownership}", Owner::No);
    second.release();  // not its to release
    EXPECT_FALSE(canBeTaken("{ownership}"));
    mutex.release();
    EXPECT_TRUE(canBeTaken("{ownership}"));
}

IN_WORLD(NamedMutex, AWaitEndsWhenTheOwnerReleasesOrCloses) {
    for (const bool closes : {false, true}) {
        auto owner = std::make_unique<NamedMutex>("{wait}", Owner::Yes);
        std::atomic<bool> isOver{false};
        Thread waiter;
        waiter.start("waiter", [&] {
            NamedMutex mutex("{wait}", Owner::No);
            EXPECT_TRUE(mutex.existedBefore());
            mutex.wait();
            isOver = mutex.isOwned();
        });
        ASSERT_TRUE(advance(10ms));
        EXPECT_FALSE(isOver);
        if (closes)
            owner.reset();
        else
            owner->release();
        waiter.join();
        EXPECT_TRUE(isOver);
    }
}

}  // namespace
}  // namespace vexa::platform
