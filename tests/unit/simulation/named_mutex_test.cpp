#include "platform/NamedMutex.h"

#include <gtest/gtest.h>
#include <signal.h>
#include <stdlib.h>
#include <sys/wait.h>
#include <unistd.h>

#include "TestMachine.h"

namespace vexa::simulation {
namespace {

using platform::NamedMutex;
using Owner = platform::NamedMutex::Owner;

/// Another process that wants to own the mutex, until it is killed.
class Other {
public:
    explicit Other(const std::string& name) {
        EXPECT_EQ(::pipe(m_pipe), 0);
        m_process = ::fork();
        if (m_process != 0) return;
        const NamedMutex mutex(name, Owner::Yes);
        const char words[] = {mutex.existedBefore() ? 'e' : 'c', mutex.isOwned() ? 'o' : '-'};
        if (::write(m_pipe[1], words, sizeof words) == sizeof words) ::pause();
        ::_exit(0);
    }

    ~Other() {
        kill();
        ::close(m_pipe[0]);
        ::close(m_pipe[1]);
    }

    Other(const Other&) = delete;
    Other& operator=(const Other&) = delete;

    /// "co": it has created and owns the mutex, "e-": it has neither.
    std::string found() {
        std::string words(2, '?');
        EXPECT_EQ(::read(m_pipe[0], words.data(), words.size()), 2);
        return words;
    }

    void kill() {
        if (m_process > 0) ::kill(m_process, SIGKILL);
        if (m_process > 0) ::waitpid(m_process, nullptr, 0);
        m_process = 0;
    }

private:
    int m_pipe[2] = {-1, -1};
    pid_t m_process = 0;
};

class NamedMutexes : public ::testing::Test {
protected:
    NamedMutexes() { ::setenv("VEXA_MACHINE", folder.path().c_str(), 1); }
    ~NamedMutexes() override { ::unsetenv("VEXA_MACHINE"); }

    TemporaryFolder folder;
};

TEST_F(NamedMutexes, AreSharedByTheProcessesOfAMachineAndFreedByTheDeathOfTheirOwner) {
    Other other("name");
    EXPECT_EQ(other.found(), "co");
    NamedMutex mine("name", Owner::Yes);
    EXPECT_TRUE(mine.existedBefore());
    EXPECT_FALSE(mine.isOwned());
    {
        const TemporaryFolder elsewhere;
        ::setenv("VEXA_MACHINE", elsewhere.path().c_str(), 1);
        EXPECT_FALSE(NamedMutex("name", Owner::No).existedBefore());
    }
    other.kill();
    mine.wait();
    EXPECT_TRUE(mine.isOwned());
}

TEST_F(NamedMutexes, OneOfManyThatStartAtOnceCreates) {
    int created = 0;
    std::vector<std::unique_ptr<Other>> others(8);
    for (auto& other : others)
        other = std::make_unique<Other>("name");
    for (const auto& other : others)
        created += other->found().front() == 'c' ? 1 : 0;
    EXPECT_EQ(created, 1);
}

TEST_F(NamedMutexes, WithoutAFolderAreNotValid) {
    ::setenv("VEXA_MACHINE", "/dev/null/machine", 1);
    NamedMutex mutex("name", Owner::Yes);
    EXPECT_FALSE(mutex.isValid());
    mutex.wait();
    EXPECT_FALSE(mutex.isOwned());
}

}  // namespace
}  // namespace vexa::simulation
