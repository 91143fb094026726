#include <atomic>
#include <csetjmp>
#include <cstdint>
#include <cstdlib>
#include <signal.h>
#include <sys/time.h>
#include <sys/wait.h>
#include <thread>
#include <unistd.h>

#include <gtest/gtest.h>

#include "ZT/error.h"
#include "ZT/timer.h"
#include "platform/clock.h"

// The beat by the real alarm, in processes that end, jump, fork and have other
// threads. Survival and order are judged, not punctuality.
namespace {

std::atomic<int> calls = 0;
std::atomic<pthread_t> called_on;

void Count(ZtTimer*, void*)
{
    called_on = pthread_self();
    ++calls;
}

void Rest(std::uint64_t milliseconds = 1)
{
    zt_platform::Clock::current().sleep_nanoseconds(milliseconds * 1000000);
}

void WaitForCalls(int count)
{
    while (calls < count)
        Rest();
}

/// The real beat, with one running timer that counts every beat.
class RealBeat : public testing::Test
{
protected:
    RealBeat()
    {
        calls = 0;
        ZtTimerBeat::start();
        timer.post_repeat(Count, nullptr, 0);
        timer.start();
    }

    ~RealBeat() override
    {
        ZtTimerBeat::stop();
        // The last beat may be under way; then it is not there any more.
        signal(SIGALRM, SIG_IGN);
    }

    ZtTimer timer;
};

TEST_F(RealBeat, BeatsAndAdvances)
{
    WaitForCalls(25);

    EXPECT_GE(ZtTimerBeat::Statistics().beats, 25);
    EXPECT_GE(timer.current.Ticks(), 24 * 24);
}

TEST_F(RealBeat, RunsOutAfterStop)
{
    WaitForCalls(2);
    ZtTimerBeat::stop();
    itimerval left = {};
    do {
        Rest(20);
        getitimer(ITIMER_REAL, &left);
    } while (left.it_value.tv_usec != 0);
    const int last = calls;

    Rest(20);

    EXPECT_EQ(calls, last);
    raise(SIGALRM);
    EXPECT_EQ(calls, last + 1);
}

TEST_F(RealBeat, SurvivesBlocksThatSwallowTheAlarm)
{
    for (int round = 0; round < 100; ++round) {
        ZtTimerBeat::block();
        zt_platform::Clock::current().sleep_nanoseconds(
            static_cast<std::uint64_t>(round % 7) * 1000000);
        ZtTimerBeat::unblock();
    }

    WaitForCalls(calls + 5);
}

TEST_F(RealBeat, AnAlarmThatAnotherThreadGetsRunsOnTheOwner)
{
    const pthread_t owner = pthread_self();
    std::thread foreign([] {
        for (int count = 0; count < 200; ++count)
            raise(SIGALRM);
    });
    foreign.join();
    WaitForCalls(5);

    EXPECT_TRUE(pthread_equal(called_on, owner));
}

TEST_F(RealBeat, GoesOnWhenTheThreadThatStartedItHasEnded)
{
    std::thread starter([] { ZtTimerBeat::start(); });
    starter.join();

    WaitForCalls(calls + 5);

    EXPECT_TRUE(pthread_equal(called_on, pthread_self()));
}

TEST_F(RealBeat, SurvivesAStormOfSignalsFromOutside)
{
    for (int count = 0; count < 20000; ++count)
        kill(getpid(), SIGALRM);

    WaitForCalls(calls + 5);
}

TEST_F(RealBeat, NoRequestIsLostOrDoubledWhenBeatsInterruptTheQueueing)
{
    static std::atomic<long> stops;
    static std::atomic<long> misplaced;
    stops = misplaced = 0;
    constexpr long pairs = 40000;
    ZtTimer counter;
    // What is stopped last was started from the time that was set before.
    counter.post_stop(
        [](ZtTimer* its, void*) {
            if (its->position_at_start.Ticks() != stops)
                ++misplaced;
            ++stops;
        },
        nullptr);
    std::atomic<bool> over = false;
    std::thread storm([&over, owner = pthread_self()] {
        while (!over) {
            pthread_kill(owner, SIGALRM);
            for (int pause = 0; pause < 20; ++pause)
                std::this_thread::yield();
        }
    });

    for (int pair = 0; pair < pairs; ++pair) {
        while (ZtTimerBeat::defer_op_count > 90)
            std::this_thread::yield();
        counter.force(KvoTime::FromTicks(pair));
        counter.start();
        counter.force(KvoTime::FromTicks(pair));
        counter.stop();
    }
    over = true;
    storm.join();
    ZtTimerBeat::execute_ops();

    EXPECT_EQ(stops, pairs);
    EXPECT_EQ(misplaced, 0);
}

TEST_F(RealBeat, ARepeatFiresAtMostOnceAMultipleInAStorm)
{
    static std::atomic<int> fired;
    fired = 0;
    timer.post_repeat([](ZtTimer*, void*) { ++fired; }, nullptr, 20);
    for (int count = 0; count < 5000; ++count)
        raise(SIGALRM);
    const std::int64_t milliseconds = (ZtTimerBeat::current_timeval.tv_sec -
                                       ZtTimerBeat::start_timeval.tv_sec) *
                                          1000 +
                                      (ZtTimerBeat::current_timeval.tv_usec -
                                       ZtTimerBeat::start_timeval.tv_usec) /
                                          1000;

    EXPECT_LE(fired, milliseconds / 20 + 2);
}

TEST_F(RealBeat, InterruptedReadsGoOn)
{
    int ends[2];
    ASSERT_EQ(pipe(ends), 0);
    std::thread writer([&ends] {
        WaitForCalls(calls + 5);
        EXPECT_EQ(write(ends[1], "x", 1), 1);
    });

    char byte = 0;
    const ssize_t got = read(ends[0], &byte, 1);

    EXPECT_EQ(got, 1);
    writer.join();
    close(ends[0]);
    close(ends[1]);
}

std::jmp_buf leave;

TEST_F(RealBeat, GoesOnAfterAJumpOutOfACallbackWhenItIsStartedAgain)
{
    static std::atomic<int> stops;
    static volatile bool jumps;
    stops = 0;
    jumps = true;
    WaitForCalls(1);
    timer.post_stop([](ZtTimer*, void*) { ++stops; }, nullptr);
    timer.post_stop(
        [](ZtTimer*, void*) {
            if (!jumps)
                return;
            jumps = false;
            std::longjmp(leave, 1);
        },
        nullptr);
    if (setjmp(leave) == 0) {
        timer.stop();
        timer.start();
        while (true)
            Rest();
    }

    ZtTimerBeat::start();
    WaitForCalls(calls + 5);

    EXPECT_EQ(stops, 1);
    EXPECT_EQ(timer.state, ZtTimer::Running);
    EXPECT_EQ(ZtTimerBeat::danger, 0);
    EXPECT_EQ(ZtTimerBeat::blocked_count, 0);
}

TEST_F(RealBeat, AJumpOutOfTheWalkLeavesNoDangerBehindWhenItIsStartedAgain)
{
    static volatile bool jumps;
    jumps = true;
    WaitForCalls(1);
    if (setjmp(leave) == 0) {
        timer.post_trigger(
            [](ZtTimer*, void*) {
                if (!jumps)
                    return;
                jumps = false;
                std::longjmp(leave, 1);
            },
            nullptr, KvoTime());
        while (true)
            Rest();
    }

    ZtTimerBeat::start();
    WaitForCalls(calls + 5);

    EXPECT_EQ(ZtTimerBeat::danger, 0);
}

TEST_F(RealBeat, AfterAJumpOutOfACallbackRequestsHoldTheAlarmBack)
{
    static volatile bool jumps;
    static volatile bool held;
    jumps = true;
    held = false;
    WaitForCalls(1);
    timer.post_stop(
        [](ZtTimer*, void*) {
            sigset_t mask;
            pthread_sigmask(SIG_SETMASK, nullptr, &mask);
            held = sigismember(&mask, SIGALRM) == 1;
            if (!jumps)
                return;
            jumps = false;
            std::longjmp(leave, 1);
        },
        nullptr);
    if (setjmp(leave) == 0) {
        timer.stop();
        while (true)
            Rest();
    }
    ZtTimerBeat::start();
    held = false;

    ZtTimerBeat::start_op(&timer);
    ZtTimerBeat::stop_op(&timer);

    EXPECT_TRUE(held);
}

TEST_F(RealBeat, AChildHasNoBeatUntilItStartsItsOwn)
{
    const pid_t child = fork();
    if (child == 0) {
        const int before = calls;
        Rest(30);
        if (calls != before)
            _exit(1);
        ZtTimerBeat::start();
        WaitForCalls(before + 5);
        _exit(7);
    }
    int status = 0;
    // The beat of the parent goes on meanwhile and interrupts the waiting.
    ASSERT_EQ(waitpid(child, &status, 0), child);

    EXPECT_TRUE(WIFEXITED(status) && WEXITSTATUS(status) == 7) << status;
    WaitForCalls(calls + 5);
}

TEST_F(RealBeat, AProcessThatIsHaltedAndContinuedGoesOnAndTriggersFireOnce)
{
    const pid_t child = fork();
    if (child == 0) {
        static std::atomic<int> fired;
        ZtTimerBeat::start();
        timer.post_trigger([](ZtTimer*, void*) { ++fired; }, nullptr,
                           KvoTime(KvoTime::milliseconds, 100));
        WaitForCalls(calls + 200);
        _exit(fired == 1 ? 7 : 1);
    }
    Rest(50);
    kill(child, SIGSTOP);
    Rest(400);
    kill(child, SIGCONT);
    int status = 0;
    ASSERT_EQ(waitpid(child, &status, 0), child);

    EXPECT_TRUE(WIFEXITED(status) && WEXITSTATUS(status) == 7) << status;
}

/// Touched by callbacks until the very end, and destroyed before the library.
struct Touched
{
    Touched() : value(new int(1)) {}
    ~Touched()
    {
        delete value;
        value = nullptr;
    }
    int* value;
};

void Touch(ZtTimer*, void* data)
{
    ++*static_cast<Touched*>(data)->value;
}

/// Arms a beat every 50 microseconds, with a callback that uses a static.
void BeatFastOnAStatic()
{
    static Touched touched;
    static ZtTimer its_timer;
    ZtTimerBeat::sample_rate = 50;
    ZtTimerBeat::start();
    its_timer.post_repeat(Touch, &touched, 0);
    its_timer.start();
    Rest(5);
}

TEST(RealBeatDeath, AProcessThatExitsWithoutStopEndsCleanly)
{
    for (int round = 0; round < 20; ++round)
        EXPECT_EXIT(
            {
                BeatFastOnAStatic();
                std::exit(7);
            },
            testing::ExitedWithCode(7), "");
}

TEST(RealBeatDeath, AProcessThatExitsInABlockEndsCleanly)
{
    EXPECT_EXIT(
        {
            BeatFastOnAStatic();
            ZtTimerBeat::block();
            std::exit(7);
        },
        testing::ExitedWithCode(7), "");
}

TEST(RealBeatDeath, ACallbackMayExit)
{
    EXPECT_EXIT(
        {
            auto* const timer = new ZtTimer;
            ZtTimerBeat::start();
            timer->post_trigger([](ZtTimer*, void*) { std::exit(7); }, nullptr,
                                KvoTime::ZERO);
            timer->start();
            while (true)
                Rest();
        },
        testing::ExitedWithCode(7), "");
}

} // namespace
