#include "platform/socket.h"

#include <arpa/inet.h>
#include <atomic>
#include <cerrno>
#include <csignal>
#include <cstring>
#include <fcntl.h>
#include <netinet/in.h>
#include <pthread.h>
#include <sched.h>
#include <string>
#include <sys/socket.h>
#include <sys/time.h>
#include <thread>
#include <unistd.h>

#include <gtest/gtest.h>

#include "support/FakeSockets.h"
#include "support/InAChild.h"

namespace {

using zt_platform::Connection;
using zt_platform::HostAddress;
using zt_platform::Sockets;

constexpr HostAddress loopback = {{127, 0, 0, 1}};

/// A socket that listens on a port of the system's choice.
class Listener
{
public:
    explicit Listener(int waiting = 5) : handle(socket(AF_INET, SOCK_STREAM, 0))
    {
        sockaddr_in own = {};
        own.sin_family = AF_INET;
        own.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
        socklen_t bytes = sizeof own;
        EXPECT_EQ(bind(handle, reinterpret_cast<sockaddr*>(&own), bytes), 0);
        EXPECT_EQ(listen(handle, waiting), 0);
        getsockname(handle, reinterpret_cast<sockaddr*>(&own), &bytes);
        port = ntohs(own.sin_port);
    }
    ~Listener() { Close(); }

    int Accept() const { return accept(handle, nullptr, nullptr); }

    void Close()
    {
        close(handle);
        handle = -1;
    }

    int handle;
    std::uint16_t port = 0;
};

TEST(Sockets, AnAddressInDottedFormIsFound)
{
    HostAddress address = {};

    ASSERT_TRUE(Sockets::current().find_host("127.3.2.1", address));

    EXPECT_EQ(std::memcmp(address.bytes, "\x7F\x03\x02\x01", 4), 0);
}

TEST(Sockets, ANameIsFound)
{
    HostAddress address = {};

    ASSERT_TRUE(Sockets::current().find_host("localhost", address));

    EXPECT_EQ(address.bytes[0], 127);
}

TEST(Sockets, WhatIsNoNameIsNotFound)
{
    HostAddress address = {{1, 2, 3, 4}};
    const std::string too_long(5000, 'x');

    for (const char* name : {static_cast<const char*>(nullptr), "", "no host",
                             "300.1.1.1", too_long.c_str()})
        EXPECT_FALSE(Sockets::current().find_host(name, address));

    EXPECT_EQ(address.bytes[3], 4);
}

TEST(Sockets, ASocketIsNotInherited)
{
    const int handle = Sockets::current().open();

    ASSERT_GE(handle, 0);
    EXPECT_EQ(fcntl(handle, F_GETFD) & FD_CLOEXEC, FD_CLOEXEC);
    Sockets::current().close(handle);
    EXPECT_EQ(fcntl(handle, F_GETFD), -1);
}

TEST(Sockets, NobodyListens)
{
    Listener listener;
    const std::uint16_t port = listener.port;
    listener.Close();
    const int handle = Sockets::current().open();

    EXPECT_FALSE(Sockets::current().connect(handle, loopback, port));

    EXPECT_EQ(errno, ECONNREFUSED);
    Sockets::current().close(handle);
}

TEST(Sockets, WritingToAClosedConnectionIsAFaultAndNoSignal)
{
    Listener listener;
    Connection connection;
    ASSERT_TRUE(connection.connect(loopback, listener.port));
    const int other = listener.Accept();
    // Only a reset after an orderly end is a fault that comes with a signal.
    shutdown(other, SHUT_WR);
    const linger at_once = {1, 0};
    setsockopt(other, SOL_SOCKET, SO_LINGER, &at_once, sizeof at_once);
    close(other);
    const std::string bytes(100000, 'b');
    // Whoever started the test may have it ignored.
    std::signal(SIGPIPE, SIG_DFL);

    EXPECT_FALSE(connection.send(bytes.data(), bytes.size()) &&
                 connection.send(bytes.data(), bytes.size()));
}

TEST(Sockets, OwnNameIsPaddedWithZeros)
{
    char name[zt_platform::host_name_bytes];
    std::memset(name, 'x', sizeof name);
    char expected[65] = {};
    ASSERT_EQ(gethostname(expected, sizeof expected), 0);

    Sockets::current().own_name(name);

    for (std::size_t i = 0; i < 63; ++i)
        EXPECT_EQ(name[i], i < std::strlen(expected) ? expected[i] : '\0') << i;
    EXPECT_EQ(name[63], '\0');
}

// The longest name that the system takes fills the field and leaves no room
// for its end.
TEST(Sockets, ANameOf64BytesIsCutAndEndedInAChild)
{
    const bool root = geteuid() == 0;
    RunInAChild([root] {
        ASSERT_EQ(unshare(CLONE_NEWUTS | (root ? 0 : CLONE_NEWUSER)), 0);
        const std::string longest(64, 'h');
        ASSERT_EQ(sethostname(longest.data(), longest.size()), 0);
        char name[zt_platform::host_name_bytes];
        std::memset(name, 'x', sizeof name);

        Sockets::current().own_name(name);

        EXPECT_EQ(std::string(name, sizeof name),
                  std::string(63, 'h') + std::string(1, '\0'));
    });
}

std::atomic<int> signals_seen = 0;

/// Has a signal arrive every half millisecond that cuts system calls short.
class Interruptions
{
public:
    Interruptions()
    {
        struct sigaction action = {};
        action.sa_handler = [](int) { ++signals_seen; };
        sigaction(SIGALRM, &action, &before);
        const itimerval often = {{0, 500}, {0, 500}};
        setitimer(ITIMER_REAL, &often, nullptr);
    }
    ~Interruptions()
    {
        const itimerval never = {};
        setitimer(ITIMER_REAL, &never, nullptr);
        sigaction(SIGALRM, &before, nullptr);
    }
    Interruptions(const Interruptions&) = delete;
    Interruptions& operator=(const Interruptions&) = delete;

private:
    struct sigaction before;
};

/// Starts a thread that no signal reaches.
template <class Work>
std::thread QuietThread(Work work)
{
    sigset_t all;
    sigset_t before;
    sigfillset(&all);
    pthread_sigmask(SIG_BLOCK, &all, &before);
    std::thread thread(work);
    pthread_sigmask(SIG_SETMASK, &before, nullptr);
    return thread;
}

TEST(Sockets, InterruptionsCutNothingInEitherDirection)
{
    Listener listener;
    const std::string bytes(3000000, 'q');
    std::string echo(bytes.size(), '\0');
    std::size_t received = 0;
    std::thread other = QuietThread([&] {
        const int connected = listener.Accept();
        char part[10000];
        ssize_t got = 0;
        while (received < bytes.size() &&
               (got = recv(connected, part, sizeof part, 0)) > 0) {
            received += static_cast<std::size_t>(got);
            usleep(100);
        }
        for (std::size_t at = 0; at < bytes.size(); at += sizeof part) {
            EXPECT_EQ(send(connected, bytes.data() + at, sizeof part, 0),
                      static_cast<ssize_t>(sizeof part));
            usleep(100);
        }
        close(connected);
    });
    signals_seen = 0;
    {
        Interruptions interruptions;
        Connection connection;
        EXPECT_TRUE(connection.connect(loopback, listener.port));
        EXPECT_TRUE(connection.send(bytes.data(), bytes.size()));
        EXPECT_TRUE(connection.receive(echo.data(), echo.size()));
        char more;
        EXPECT_FALSE(connection.receive(&more, 1));
    }
    other.join();
    EXPECT_EQ(received, bytes.size());
    EXPECT_TRUE(echo == bytes);
    EXPECT_GT(signals_seen, 10);
}

// A full queue leaves connections waiting until the system tries again, about
// a second later.
TEST(Sockets, AnInterruptedConnectIsWaitedFor)
{
    Listener listener(0);
    Connection first;
    ASSERT_TRUE(first.connect(loopback, listener.port));
    std::thread other = QuietThread([&] {
        usleep(200000);
        close(listener.Accept());
        close(listener.Accept());
    });
    signals_seen = 0;
    {
        Interruptions interruptions;
        Connection second;
        EXPECT_TRUE(second.connect(loopback, listener.port));
    }
    other.join();
    EXPECT_GT(signals_seen, 100);
}

TEST(Sockets, AnInterruptedConnectTellsWhyItFailed)
{
    Interruptions interruptions;
    Listener listener;
    const std::uint16_t port = listener.port;
    listener.Close();
    for (int i = 0; i < 200; ++i) {
        Connection connection;
        ASSERT_FALSE(connection.connect(loopback, port));
        ASSERT_EQ(errno, ECONNREFUSED);
    }
}

TEST(Connection, WithoutASocketNothingIsConnectedNorClosed)
{
    FakeSockets sockets;
    sockets.opens_fail = true;
    {
        Connection connection;
        EXPECT_FALSE(connection.is_open());
        EXPECT_FALSE(connection.connect(loopback, 1));
    }
    EXPECT_EQ(sockets.closed, 0);
}

TEST(Connection, IsClosedAtTheEndOfItsScope)
{
    FakeSockets sockets;
    {
        Connection connection;
        EXPECT_TRUE(connection.is_open());
        EXPECT_EQ(sockets.closed, 0);
    }
    EXPECT_EQ(sockets.closed, 1);
}

TEST(Connection, NothingToTransferIsDoneAtOnce)
{
    FakeSockets sockets;
    sockets.send_ends = 0;
    sockets.answer = "";
    Connection connection;

    EXPECT_TRUE(connection.send(nullptr, 0));
    EXPECT_TRUE(connection.receive(nullptr, 0));
}

TEST(Sockets, TheSystemsAreInUseUnlessOthersAreInstalled)
{
    EXPECT_EQ(&Sockets::current(), &Sockets::system());
    FakeSockets sockets;
    EXPECT_EQ(&Sockets::current(), &sockets);
    EXPECT_EQ(Sockets::install(&sockets), &sockets);
}

} // namespace
