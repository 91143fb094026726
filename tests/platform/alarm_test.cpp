#include "platform/alarm.h"

#include <atomic>
#include <cerrno>
#include <signal.h>
#include <sys/time.h>
#include <thread>
#include <unistd.h>

#include <gtest/gtest.h>

#include "platform/clock.h"

// The real alarm of the process. What is judged is that it comes and who gets
// it, never how punctual it is.
namespace {

using zt_platform::Alarm;
using zt_platform::AlarmDisposition;

std::atomic<int> alarms = 0;
std::atomic<pthread_t> handled_on;

void Count(int)
{
    handled_on = pthread_self();
    ++alarms;
}

struct sigaction Action()
{
    struct sigaction now = {};
    sigaction(SIGALRM, nullptr, &now);
    return now;
}

void WaitForAlarms(int count)
{
    while (alarms < count)
        zt_platform::Clock::current().sleep_nanoseconds(1000000);
}

class AlarmTest : public testing::Test
{
protected:
    AlarmTest() : alarm(Alarm::current())
    {
        alarms = 0;
        alarm.own();
        alarm.listen(Count);
    }

    ~AlarmTest() override
    {
        const itimerval never = {};
        setitimer(ITIMER_REAL, &never, nullptr);
        signal(SIGALRM, SIG_IGN);
    }

    Alarm& alarm;
};

TEST_F(AlarmTest, RunsDownOnceAndRaisesTheSignal)
{
    alarm.arm(2000);
    WaitForAlarms(1);

    EXPECT_EQ(alarm.left().seconds, 0);
    EXPECT_EQ(alarm.left().microseconds, 0);
    zt_platform::Clock::current().sleep_nanoseconds(10000000);
    EXPECT_EQ(alarms, 1);
}

TEST_F(AlarmTest, ALongWaitIsSplit)
{
    alarm.arm(3500000);

    EXPECT_EQ(alarm.left().seconds, 3);
    EXPECT_LE(alarm.left().microseconds, 500000);
}

TEST_F(AlarmTest, TheHandlerStaysRestartsCallsAndHoldsSignalsBack)
{
    raise(SIGALRM);
    raise(SIGALRM);

    EXPECT_EQ(alarms, 2);
    EXPECT_NE(Action().sa_flags & SA_RESTART, 0);
    EXPECT_FALSE(Action().sa_flags & static_cast<int>(SA_RESETHAND));
    const sigset_t mask = Action().sa_mask;
    EXPECT_EQ(sigismember(&mask, SIGTERM), 1);
    EXPECT_EQ(sigismember(&mask, SIGSEGV), 0);
}

TEST_F(AlarmTest, ErrnoIsKept)
{
    alarm.listen([](int) { errno = EDOM; });
    errno = ERANGE;

    raise(SIGALRM);

    EXPECT_EQ(errno, ERANGE);
}

TEST_F(AlarmTest, IgnoredItIsThrownAway)
{
    const AlarmDisposition before = alarm.ignore();
    EXPECT_EQ(Action().sa_handler, SIG_IGN);
    raise(SIGALRM);

    alarm.restore(before);

    EXPECT_EQ(alarms, 0);
    EXPECT_EQ(Action().sa_handler, before.function);
    raise(SIGALRM);
    EXPECT_EQ(alarms, 1);
}

TEST_F(AlarmTest, RestorePutsTheWholeDispositionBack)
{
    struct sigaction ours = {};
    ours.sa_handler = Count;
    ours.sa_flags = SA_NODEFER;
    sigemptyset(&ours.sa_mask);
    sigaddset(&ours.sa_mask, SIGUSR1);
    sigaction(SIGALRM, &ours, nullptr);

    alarm.restore(alarm.ignore());

    EXPECT_EQ(Action().sa_handler, Count);
    EXPECT_NE(Action().sa_flags & SA_NODEFER, 0);
    const sigset_t mask = Action().sa_mask;
    EXPECT_EQ(sigismember(&mask, SIGUSR1), 1);
}

TEST_F(AlarmTest, RestoreFollowsAFunctionThatWasChanged)
{
    AlarmDisposition before = alarm.ignore();
    before.function = nullptr;

    alarm.restore(before);

    EXPECT_EQ(Action().sa_handler, SIG_DFL);
}

TEST_F(AlarmTest, ASignalThatIsHeldBackWaitsAndIsLetThrough)
{
    sigset_t set;
    sigemptyset(&set);
    sigaddset(&set, SIGALRM);
    pthread_sigmask(SIG_BLOCK, &set, nullptr);
    EXPECT_FALSE(alarm.waiting());
    raise(SIGALRM);
    EXPECT_TRUE(alarm.waiting());
    EXPECT_EQ(alarms, 0);

    alarm.let_through();

    EXPECT_FALSE(alarm.waiting());
    EXPECT_EQ(alarms, 1);
}

TEST_F(AlarmTest, AForeignThreadHandsItOverToTheOwner)
{
    std::thread foreign([] { raise(SIGALRM); });
    foreign.join();
    WaitForAlarms(1);

    EXPECT_EQ(handled_on, pthread_self());
    EXPECT_EQ(alarms, 1);
}

TEST_F(AlarmTest, ErrnoIsKeptOnTheForeignThreadToo)
{
    int seen = 0;
    std::thread foreign([&seen] {
        errno = ERANGE;
        raise(SIGALRM);
        seen = errno;
    });
    foreign.join();

    EXPECT_EQ(seen, ERANGE);
    WaitForAlarms(1);
}

TEST_F(AlarmTest, TheLatestOwnerGetsIt)
{
    pthread_t owner = {};
    std::atomic<bool> owned = false;
    std::thread other([&owner, &owned, this] {
        owner = pthread_self();
        alarm.own();
        owned = true;
        WaitForAlarms(1);
    });
    while (!owned)
        std::this_thread::yield();

    raise(SIGALRM);
    other.join();

    EXPECT_TRUE(pthread_equal(handled_on, owner));
}

TEST_F(AlarmTest, WithTheOwnerGoneItIsHandledWhereItArrives)
{
    std::thread other([this] { alarm.own(); });
    other.join();

    raise(SIGALRM);

    EXPECT_EQ(alarms, 1);
    EXPECT_EQ(handled_on, pthread_self());
}

TEST_F(AlarmTest, ATestMayInstallItsOwn)
{
    EXPECT_EQ(&Alarm::current(), &Alarm::system());
    EXPECT_EQ(Alarm::install(&Alarm::system()), nullptr);
    EXPECT_EQ(Alarm::install(nullptr), &Alarm::system());
}

TEST_F(AlarmTest, AtExitItIsDisarmedAndIgnoredDeath)
{
    EXPECT_EXIT(
        {
            // Registered earlier, so it runs after the alarm is silenced.
            std::atexit([] {
                const bool silent = Action().sa_handler == SIG_IGN &&
                                    Alarm::current().left().seconds == 0;
                _exit(silent ? 7 : 1);
            });
            alarm.silence_at_exit();
            alarm.silence_at_exit();
            alarm.arm(60000000);
            std::exit(0);
        },
        testing::ExitedWithCode(7), "");
}

TEST_F(AlarmTest, AtExitAnotherHandlersAlarmIsLeftAloneDeath)
{
    EXPECT_EXIT(
        {
            std::atexit(
                [] { _exit(Alarm::current().left().seconds > 0 ? 7 : 1); });
            alarm.silence_at_exit();
            signal(SIGALRM, Count);
            alarm.arm(60000000);
            std::exit(0);
        },
        testing::ExitedWithCode(7), "");
}

} // namespace
