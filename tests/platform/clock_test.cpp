#include "platform/clock.h"

#include <csignal>
#include <ctime>
#include <sys/time.h>

#include <gtest/gtest.h>

#include "support/FakeClock.h"

using zt_platform::Clock;

TEST(Clock, TheWallClockIsTheSystems)
{
    const std::time_t before = std::time(nullptr);
    const timeval now = Clock::current().wall();
    const std::time_t after = std::time(nullptr);

    // The system's coarse clock may lag a tick behind.
    EXPECT_GE(now.tv_sec, before - 1);
    EXPECT_LE(now.tv_sec, after + 1);
    EXPECT_GE(now.tv_usec, 0);
    EXPECT_LT(now.tv_usec, 1000000);
}

TEST(Clock, TheSteadyClockNeverGoesBack)
{
    std::uint64_t last = Clock::current().steady_nanoseconds();
    for (int reading = 0; reading < 10000; ++reading) {
        const std::uint64_t now = Clock::current().steady_nanoseconds();
        ASSERT_GE(now, last);
        last = now;
    }
}

TEST(Clock, InstallGivesBackWhatWasInUse)
{
    Clock& systems = Clock::current();
    {
        FakeClock outer;
        FakeClock inner;
        EXPECT_EQ(&Clock::current(), &inner);
        EXPECT_EQ(Clock::install(&inner), &inner);
    }
    EXPECT_EQ(&Clock::current(), &systems);
    EXPECT_EQ(Clock::install(nullptr), nullptr);
}

namespace {
volatile std::sig_atomic_t alarms = 0;
}

TEST(Clock, ASleepLastsItsFullTimeHoweverOftenItIsInterrupted)
{
    struct sigaction action = {}, action_before = {};
    action.sa_handler = [](int) { alarms = alarms + 1; };
    sigaction(SIGALRM, &action, &action_before);
    itimerval every_millisecond = {{0, 1000}, {0, 1000}}, off = {};
    setitimer(ITIMER_REAL, &every_millisecond, nullptr);

    const std::uint64_t from = Clock::current().steady_nanoseconds();
    Clock::current().sleep_nanoseconds(30000000);
    const std::uint64_t to = Clock::current().steady_nanoseconds();

    setitimer(ITIMER_REAL, &off, nullptr);
    sigaction(SIGALRM, &action_before, nullptr);
    EXPECT_GE(to - from, 30000000u);
    EXPECT_GE(alarms, 2);
}

TEST(FakeClock, MovesOnlyWhenTold)
{
    FakeClock clock(1000);

    const timeval start = Clock::current().wall();
    const std::uint64_t steady = Clock::current().steady_nanoseconds();
    Clock::current().sleep_nanoseconds(1500000000);
    clock.AdvanceMicroseconds(-1000000);

    EXPECT_EQ(start.tv_sec, 1000);
    EXPECT_EQ(Clock::current().wall().tv_sec, 1000);
    EXPECT_EQ(Clock::current().wall().tv_usec, 500000);
    EXPECT_EQ(Clock::current().steady_nanoseconds() - steady, 1500000000u);
}
