#include "platform/NamedMutex.h"

#include <gtest/gtest.h>
#include <signal.h>
#include <stdlib.h>
#include <sys/wait.h>
#include <unistd.h>

#include <functional>

#include "TestMachine.h"

namespace vexa::simulation {
namespace {

using platform::NamedMutex;
using Owner = platform::NamedMutex::Owner;

const std::string kName = "{39EAA3ED-1A26-46B7-90A7-AAFFECE80392}";

/// Another process. It says a word when it is ready, and goes on when it is told to.
class Other {
public:
    explicit Other(
        const std::function<char()>& prepare, const std::function<void()>& goOn = [] {}) {
        EXPECT_EQ(::pipe(m_toParent), 0);
        EXPECT_EQ(::pipe(m_toChild), 0);
        m_process = ::fork();
        if (m_process != 0) return;
        const char word = prepare();
        char order = 0;
        if (::write(m_toParent[1], &word, 1) == 1 && ::read(m_toChild[0], &order, 1) == 1) goOn();
        ::_exit(0);
    }

    ~Other() {
        if (m_process > 0) kill();
        for (const int end : {m_toParent[0], m_toParent[1], m_toChild[0], m_toChild[1]})
            ::close(end);
    }

    Other(const Other&) = delete;
    Other& operator=(const Other&) = delete;

    char hear() {
        char word = 0;
        EXPECT_EQ(::read(m_toParent[0], &word, 1), 1);
        return word;
    }

    void tell() { EXPECT_EQ(::write(m_toChild[1], "g", 1), 1); }

    void kill() {
        ::kill(m_process, SIGKILL);
        ::waitpid(m_process, nullptr, 0);
        m_process = 0;
    }

private:
    int m_toParent[2];
    int m_toChild[2];
    pid_t m_process = 0;
};

class NamedMutexes : public ::testing::Test {
protected:
    NamedMutexes() { ::setenv("VEXA_MACHINE", folder.path().c_str(), 1); }
    ~NamedMutexes() override { ::unsetenv("VEXA_MACHINE"); }

    TemporaryFolder folder;
};

TEST_F(NamedMutexes, ExistWhileSomebodyHasThemOpen) {
    {
        const NamedMutex first(kName, Owner::Yes);
        EXPECT_TRUE(first.isValid());
        EXPECT_FALSE(first.existedBefore());
        EXPECT_TRUE(first.isOwned());
        const NamedMutex second(kName, Owner::Yes);
        EXPECT_TRUE(second.existedBefore());
        EXPECT_FALSE(second.isOwned());
        const NamedMutex other("another", Owner::No);
        EXPECT_FALSE(other.existedBefore());
    }
    const NamedMutex again(kName, Owner::No);
    EXPECT_FALSE(again.existedBefore());
    EXPECT_FALSE(again.isOwned());
}

TEST_F(NamedMutexes, AreSeenByOtherProcessesOfTheMachine) {
    Other other([] {
        static const NamedMutex mutex(kName, Owner::Yes);
        return mutex.isOwned() && !mutex.existedBefore() ? 'o' : 'x';
    });
    EXPECT_EQ(other.hear(), 'o');
    const NamedMutex mine(kName, Owner::Yes);
    EXPECT_TRUE(mine.existedBefore());
    EXPECT_FALSE(mine.isOwned());

    const TemporaryFolder elsewhere;
    ::setenv("VEXA_MACHINE", elsewhere.path().c_str(), 1);
    EXPECT_FALSE(NamedMutex(kName, Owner::No).existedBefore());
}

TEST_F(NamedMutexes, AWaitEndsWithTheRelease) {
    Other other(
        [] {
            static NamedMutex mutex(kName, Owner::Yes);
            return mutex.isOwned() ? 'o' : 'x';
        },
        [] {
            NamedMutex again(kName, Owner::No);
            again.release();  // not its to release
            ::_exit(again.isOwned() ? 1 : 0);
        });
    EXPECT_EQ(other.hear(), 'o');
    NamedMutex mine(kName, Owner::No);
    other.tell();
    mine.wait();
    EXPECT_TRUE(mine.isOwned());
}

TEST_F(NamedMutexes, TheDeathOfTheOwnerReleasesThem) {
    Other other([] {
        static const NamedMutex mutex(kName, Owner::Yes);
        return mutex.isOwned() ? 'o' : 'x';
    });
    EXPECT_EQ(other.hear(), 'o');
    NamedMutex mine(kName, Owner::No);
    EXPECT_TRUE(mine.existedBefore());
    other.kill();
    mine.wait();
    EXPECT_TRUE(mine.isOwned());
}

TEST_F(NamedMutexes, OneOfManyThatStartAtOnceCreates) {
    int created = 0;
    std::vector<std::unique_ptr<Other>> others(8);
    for (auto& other : others) {
        other = std::make_unique<Other>([] {
            static const NamedMutex mutex(kName, Owner::Yes);
            return mutex.existedBefore() ? 'e' : 'c';
        });
    }
    for (const auto& other : others)
        created += other->hear() == 'c' ? 1 : 0;
    EXPECT_EQ(created, 1);
}

TEST_F(NamedMutexes, WithoutAFolderAreNotValid) {
    ::setenv("VEXA_MACHINE", "/dev/null/machine", 1);
    NamedMutex mutex(kName, Owner::Yes);
    EXPECT_FALSE(mutex.isValid());
    mutex.wait();
    EXPECT_FALSE(mutex.isOwned());
}

}  // namespace
}  // namespace vexa::simulation
