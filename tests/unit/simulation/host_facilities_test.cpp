#include <gtest/gtest.h>
#include <stdlib.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <boost/asio.hpp>
#include <set>

#include "TestMachine.h"
#include "platform/DebugOutput.h"
#include "platform/NamedMutex.h"
#include "platform/posix/KernelTcp.h"
#include "platform/posix/MachineFolder.h"
#include "platform/posix/OwnerFiles.h"
#include "platform/posix/ProcNetTcp.h"

namespace vexa::simulation {
namespace {

using platform::NamedMutex;
using posix::readFile;
using posix::replaceFile;
using Owner = NamedMutex::Owner;

TEST(DebugOutput, DropsOneLineEndAndIsUtf8) {
    TestMachine machine;
    platform::outputDebugString(std::string_view("three\n\n"));
    platform::outputDebugString(std::wstring_view(L"caf\u00E9"));
    EXPECT_EQ(readFile(machine->folder() / "debug.log"), "three\n\ncaf\xC3\xA9\n");
}

TEST(OwnerFiles, ReplacingLeavesNothingElseBehind) {
    const TemporaryFolder folder;
    const auto path = folder.path() / "a" / "b" / "file";
    EXPECT_TRUE(replaceFile(path, "old"));
    EXPECT_TRUE(replaceFile(path, "new"));
    EXPECT_EQ(readFile(path), "new");
    EXPECT_EQ(std::distance(std::filesystem::directory_iterator(path.parent_path()), {}), 1);
    EXPECT_EQ(std::filesystem::status(path.parent_path()).permissions(), std::filesystem::perms::owner_all);
    EXPECT_FALSE(replaceFile(path / "below a file", "x"));
}

// The kernel gives the table in pieces, and a connection that moves meanwhile in two of them.
TEST(ProcNetTcp, HoldsEachConnectionOnceAndEveryoneWhoListens) {
    const TemporaryFolder folder;
    const auto path = folder.path() / "tcp";
    const std::string rest = " 00000000:00000000 00:00000000 00000000  1000        0 4711 1\n";
    const std::string connection = "  1: 0100007F:1F90 0100007F:D431 01" + rest;
    const std::string listener = "  0: 0100007F:1F90 00000000:0000 0A" + rest;
    ASSERT_TRUE(replaceFile(path, "  sl  local_address\n" + listener + listener + connection + connection));
    std::vector<posix::TcpSocket> rows;
    ASSERT_TRUE(posix::readProcNetTcp(path.string(), rows));
    ASSERT_EQ(rows.size(), 3U);
    EXPECT_EQ(rows[2].localPort, 8080);
    EXPECT_EQ(rows[2].remotePort, 54321);
    EXPECT_EQ(rows[2].uid, 1000U);
    EXPECT_EQ(rows[2].inode, 4711U);
    ASSERT_TRUE(posix::readProcNetTcp(path.string(), rows, posix::TcpSockets::Listening));
    EXPECT_EQ(rows.size(), 2U);
}

TEST(KernelTcp, TellsWhatTheFileTells) {
    using boost::asio::ip::tcp;
    const tcp::endpoint anyPort(boost::asio::ip::address_v4::loopback(), 0);
    boost::asio::io_context io;
    tcp::acceptor listener(io, anyPort);
    const tcp::socket bound(io, anyPort);
    tcp::socket clients[] = {tcp::socket(io), tcp::socket(io)};
    for (tcp::socket& client : clients)
        client.connect(listener.local_endpoint());
    const tcp::socket kept = listener.accept();
    listener.accept().close();
    clients[1].close();  // the other end is in TIME_WAIT
    const auto rowsOf = [&](const std::vector<posix::TcpSocket>& rows) {
        std::multiset<std::string> texts;
        for (const auto& [local, remote, port, remotePort, state, uid, inode] : rows)
            for (const tcp::endpoint& end : {listener.local_endpoint(), bound.local_endpoint()})
                if (end.port() == port || end.port() == remotePort)
                    texts.insert(local + " " + std::to_string(port) + " " + remote + " " +
                                 std::to_string(remotePort) + " " + std::to_string(state) + " " +
                                 std::to_string(uid) + " " + std::to_string(inode));
        return texts;
    };
    std::vector<posix::TcpSocket> asked;
    std::vector<posix::TcpSocket> read;
    ASSERT_TRUE(posix::readKernelTcp(asked) && posix::readProcNetTcp("/proc/net/tcp", read));
    EXPECT_EQ(rowsOf(asked), rowsOf(read));
    EXPECT_EQ(rowsOf(asked).size(), 4U);
}

TEST(MachineFolder, IsWhatTheEnvironmentSays) {
    ::unsetenv("HOME");
    ::unsetenv("XDG_STATE_HOME");
    ::unsetenv("VEXA_MACHINE");
    EXPECT_EQ(posix::machineFolder(), "");
    ::setenv("HOME", "/home/u", 1);
    EXPECT_EQ(posix::machineFolder(), "/home/u/.local/state/vexa/machine");
    ::setenv("XDG_STATE_HOME", "/state", 1);
    EXPECT_EQ(posix::machineFolder(), "/state/vexa/machine");
    ::setenv("VEXA_MACHINE", "/m", 1);
    EXPECT_EQ(posix::machineFolder(), "/m");
    ::unsetenv("VEXA_MACHINE");
}

TEST(NamedMutex, IsCreatedByOneOfManyProcessesThatStartAtOnceAndEndsWithThem) {
    constexpr int kProcesses = 8;
    const TemporaryFolder folder;
    ::setenv("VEXA_MACHINE", folder.path().c_str(), 1);
    int words[2];
    int end[2];
    ASSERT_EQ(::pipe(words), 0);
    ASSERT_EQ(::pipe(end), 0);
    for (int i = 0; i < kProcesses; ++i) {
        if (::fork() != 0) continue;
        const NamedMutex mutex("name", Owner::Yes);
        char word = mutex.existedBefore() ? 'e' : 'c';
        ::close(end[1]);
        const bool isTold = ::write(words[1], &word, 1) == 1;
        ::_exit(isTold && ::read(end[0], &word, 1) == 0 ? 0 : 1);  // its parent lets it go
    }
    std::string found(kProcesses, '?');
    for (char& word : found)
        EXPECT_EQ(::read(words[0], &word, 1), 1);
    EXPECT_EQ(std::count(found.begin(), found.end(), 'c'), 1) << found;
    EXPECT_FALSE(NamedMutex("name", Owner::Yes).isOwned());
    for (const int descriptor : {words[0], words[1], end[0], end[1]})
        ::close(descriptor);
    while (::wait(nullptr) > 0) {
    }
    EXPECT_TRUE(NamedMutex("name", Owner::Yes).isOwned());
    ::setenv("VEXA_MACHINE", "/dev/null/machine", 1);
    NamedMutex nowhere("name", Owner::Yes);
    EXPECT_FALSE(nowhere.isValid());
    nowhere.wait();
    EXPECT_FALSE(nowhere.isOwned());
}

}  // namespace
}  // namespace vexa::simulation
