#include <cstdlib>
#include <ctime>
#include <signal.h>
#include <time.h>

#include "support/BeatTest.h"
#include "support/CapturedStderr.h"
#include "support/ThrowingStderr.h"

namespace {

KvoTime Ticks(int count)
{
    return KvoTime::FromTicks(count);
}

using Handler = void (*)(int);

Handler Disposition()
{
    struct sigaction now = {};
    sigaction(SIGALRM, nullptr, &now);
    return now.sa_handler;
}

bool AlarmIsHeldBack()
{
    sigset_t mask;
    pthread_sigmask(SIG_SETMASK, nullptr, &mask);
    return sigismember(&mask, SIGALRM) == 1;
}

class ZtTimerBeatTest : public BeatTest
{};

TEST_F(ZtTimerBeatTest, StandsStillUntilItIsStarted)
{
    EXPECT_EQ(ZtTimerBeat::sample_rate, 4000);
    EXPECT_EQ(ZtTimerBeat::reload_flag, 0);
    EXPECT_EQ(ZtTimerBeat::danger, 0);
    EXPECT_EQ(ZtTimerBeat::blocked_count, 0);
    EXPECT_EQ(ZtTimerBeat::defer_op_count, 0);
    EXPECT_FALSE(alarm.Armed());
    for (const ZtTimer* slot : ZtTimerBeat::timers)
        EXPECT_EQ(slot, nullptr);
}

TEST_F(ZtTimerBeatTest, LoadArmsOneBeatAfterThePeriod)
{
    ZtTimerBeat::load();

    EXPECT_TRUE(alarm.Armed());
    EXPECT_EQ(alarm.Wait(), 4000);
    EXPECT_EQ(ZtTimerBeat::itimer.it_interval.tv_sec, 0);
    EXPECT_EQ(ZtTimerBeat::itimer.it_interval.tv_usec, 0);
    EXPECT_EQ(ZtTimerBeat::itimer.it_value.tv_sec, 0);
    EXPECT_EQ(ZtTimerBeat::itimer.it_value.tv_usec, 4000);
    Beats(1);
    EXPECT_FALSE(alarm.Armed());
}

TEST_F(ZtTimerBeatTest, LoadSetsTheClockToTheLocalTimeOfDayInWholeSeconds)
{
    const char* const zone = std::getenv("TZ");
    const std::string kept = zone ? zone : "";
    setenv("TZ", "ZTT-05:30", 1);
    tzset();
    clock.SetWall(86400 * 1000 + 3600 + 59, 700000); // 01:00:59.7 UTC

    ZtTimerBeat::load();

    EXPECT_EQ(ZtTimerBeat::global_tm, KvoTime(6, 30, 59, 0));
    EXPECT_EQ(ZtTimerBeat::global_start_tm, ZtTimerBeat::global_tm);
    EXPECT_EQ(ZtTimerBeat::start_timeval.tv_sec, 86400 * 1000 + 3600 + 59);
    EXPECT_EQ(ZtTimerBeat::start_timeval.tv_usec, 700000);
    if (zone)
        setenv("TZ", kept.c_str(), 1);
    else
        unsetenv("TZ");
    tzset();
}

TEST_F(ZtTimerBeatTest, TheHandlerRestartsCallsAndHoldsOtherSignalsBack)
{
    ZtTimerBeat::load();

    struct sigaction now = {};
    sigaction(SIGALRM, nullptr, &now);

    EXPECT_NE(now.sa_flags & SA_RESTART, 0);
    EXPECT_FALSE(now.sa_flags & static_cast<int>(SA_RESETHAND));
    EXPECT_EQ(sigismember(&now.sa_mask, SIGINT), 1);
    EXPECT_EQ(sigismember(&now.sa_mask, SIGSEGV), 0);
}

TEST_F(ZtTimerBeatTest, StartKeepsTheBeatGoing)
{
    ZtTimerBeat::start();

    EXPECT_EQ(ZtTimerBeat::reload_flag, 1);
    Beats(100);
    EXPECT_EQ(Milliseconds(), 400);
    EXPECT_EQ(alarm.Wait(), 4000);
}

TEST_F(ZtTimerBeatTest, StartEndsABlock)
{
    ZtTimerBeat::start();
    ZtTimerBeat::block();
    ZtTimerBeat::start();

    EXPECT_EQ(ZtTimerBeat::blocked_count, 0);
    EXPECT_NE(Disposition(), SIG_IGN);
    Beats(2);
}

TEST_F(ZtTimerBeatTest, StartLetsTheAlarmThroughToItsCaller)
{
    sigset_t alarm_only;
    sigemptyset(&alarm_only);
    sigaddset(&alarm_only, SIGALRM);
    pthread_sigmask(SIG_BLOCK, &alarm_only, nullptr);

    ZtTimerBeat::start();

    EXPECT_FALSE(AlarmIsHeldBack());
    Beats(2);
}

TEST_F(ZtTimerBeatTest, AfterStopExactlyOneFurtherBeatRuns)
{
    ZtTimerBeat::start();
    Beats(3);

    ZtTimerBeat::stop();

    EXPECT_TRUE(alarm.Step());
    EXPECT_FALSE(alarm.Step());
    EXPECT_EQ(ZtTimerBeat::Statistics().beats, 4);
    EXPECT_NE(Disposition(), SIG_DFL);
}

TEST_F(ZtTimerBeatTest, StoppedInACallbackTheBeatInProgressIsTheLast)
{
    ZtTimerBeat::start();
    ZtTimer timer;
    timer.post_trigger([](ZtTimer*, void*) { ZtTimerBeat::stop(); }, nullptr,
                       Ticks(0));
    timer.start();

    Beats(2);

    EXPECT_FALSE(alarm.Armed());
}

TEST_F(ZtTimerBeatTest, ReloadArmsAgainAndInstallsTheHandlerAgain)
{
    ZtTimerBeat::start();
    const Handler handler = Disposition();
    signal(SIGALRM, SIG_IGN);

    ZtTimerBeat::reload(1234);

    EXPECT_EQ(alarm.Wait(), 1234);
    EXPECT_EQ(ZtTimerBeat::itimer.it_value.tv_usec, 1234);
    EXPECT_EQ(Disposition(), handler);
}

TEST_F(ZtTimerBeatTest, EveryBeatInstallsTheHandlerAgain)
{
    ZtTimerBeat::start();
    const Handler handler = Disposition();
    ZtTimer timer;
    timer.post_trigger([](ZtTimer*, void*) { signal(SIGALRM, SIG_DFL); },
                       nullptr, Ticks(0));
    timer.start();

    Beats(2);

    EXPECT_EQ(Disposition(), handler);
}

TEST_F(ZtTimerBeatTest, WaitsOfASecondAndMoreAreSplit)
{
    ZtTimerBeat::sample_rate = 1000000;
    ZtTimerBeat::start();
    EXPECT_EQ(ZtTimerBeat::itimer.it_value.tv_sec, 1);
    EXPECT_EQ(ZtTimerBeat::itimer.it_value.tv_usec, 0);

    ZtTimerBeat::reload(3500000);

    EXPECT_EQ(ZtTimerBeat::itimer.it_value.tv_sec, 3);
    EXPECT_EQ(ZtTimerBeat::itimer.it_value.tv_usec, 500000);
}

TEST_F(ZtTimerBeatTest, WaitsBelowOneMicrosecondAreOne)
{
    for (const int wait : {0, -1, -2000000000}) {
        ZtTimerBeat::reload(wait);
        EXPECT_EQ(alarm.Wait(), 1);
    }
    ZtTimerBeat::sample_rate = 0;
    ZtTimerBeat::load();
    EXPECT_EQ(alarm.Wait(), 1);
}

TEST_F(ZtTimerBeatTest, TheSignalDrivesTheClock)
{
    ZtTimerBeat::start();
    const KvoTime began = ZtTimerBeat::global_tm;

    Beats(5);

    EXPECT_EQ(ZtTimerBeat::global_tm, began + Ticks(5 * 24));
    EXPECT_EQ(ZtTimerBeat::current_timeval.tv_sec,
              ZtTimerBeat::start_timeval.tv_sec);
    EXPECT_EQ(ZtTimerBeat::current_timeval.tv_usec,
              ZtTimerBeat::start_timeval.tv_usec + 20000);
}

TEST_F(ZtTimerBeatTest, MillisecondsAreTheDifferenceOfWholeOnes)
{
    clock.SetWall(1000, 999999);
    ZtTimerBeat::start();
    const KvoTime began = ZtTimerBeat::global_tm;

    // One microsecond later it is 1001.000000: 1000 ms less 999.
    clock.AdvanceMicroseconds(1);
    ZtTimerBeat::fire(0, 0, nullptr);

    EXPECT_EQ(ZtTimerBeat::current_timeval.tv_sec, 1001);
    EXPECT_EQ(ZtTimerBeat::current_timeval.tv_usec, 0);
    EXPECT_EQ(ZtTimerBeat::global_tm, began + Ticks(6));
}

TEST_F(ZtTimerBeatTest, ABlockIgnoresTheAlarmUntilItEnds)
{
    ZtTimerBeat::start();
    const Handler handler = Disposition();

    ZtTimerBeat::block();
    EXPECT_EQ(ZtTimerBeat::blocked_count, 1);
    EXPECT_EQ(ZtTimerBeat::sigfunc, handler);
    EXPECT_EQ(Disposition(), SIG_IGN);
    ZtTimerBeat::unblock();

    EXPECT_EQ(ZtTimerBeat::blocked_count, 0);
    EXPECT_EQ(Disposition(), handler);
    Beats(1);
}

TEST_F(ZtTimerBeatTest, BlockDoesNotNest)
{
    ZtTimerBeat::start();
    const Handler handler = Disposition();

    ZtTimerBeat::block();
    ZtTimerBeat::block();
    EXPECT_EQ(ZtTimerBeat::blocked_count, 1);
    ZtTimerBeat::unblock();

    EXPECT_EQ(Disposition(), handler);
    EXPECT_EQ(ZtTimerBeat::blocked_count, 0);
}

TEST_F(ZtTimerBeatTest, UnblockWithoutABlockDoesNothing)
{
    ZtTimerBeat::start();
    const Handler handler = Disposition();

    ZtTimerBeat::unblock();
    ZtTimerBeat::unblock();

    EXPECT_EQ(ZtTimerBeat::blocked_count, 0);
    EXPECT_EQ(Disposition(), handler);
}

TEST_F(ZtTimerBeatTest, UnblockCountsDownFromACountAboveOne)
{
    ZtTimerBeat::start();
    ZtTimerBeat::block();
    ZtTimerBeat::blocked_count = 2;

    ZtTimerBeat::unblock();
    EXPECT_EQ(Disposition(), SIG_IGN);
    ZtTimerBeat::unblock();

    EXPECT_NE(Disposition(), SIG_IGN);
}

TEST_F(ZtTimerBeatTest, ABlockPutsTheWholeDispositionBack)
{
    struct sigaction ours = {};
    ours.sa_handler = [](int) {};
    ours.sa_flags = SA_NODEFER;
    sigemptyset(&ours.sa_mask);
    sigaddset(&ours.sa_mask, SIGUSR2);
    sigaction(SIGALRM, &ours, nullptr);

    ZtTimerBeat::block();
    ZtTimerBeat::unblock();

    struct sigaction now = {};
    sigaction(SIGALRM, nullptr, &now);
    EXPECT_EQ(now.sa_handler, ours.sa_handler);
    EXPECT_NE(now.sa_flags & SA_NODEFER, 0);
    EXPECT_EQ(sigismember(&now.sa_mask, SIGUSR2), 1);
}

TEST_F(ZtTimerBeatTest, UnblockPutsBackWhatSigfuncSays)
{
    ZtTimerBeat::start();
    ZtTimerBeat::block();
    ZtTimerBeat::sigfunc = SIG_DFL;

    ZtTimerBeat::unblock();

    EXPECT_EQ(Disposition(), SIG_DFL);
}

TEST_F(ZtTimerBeatTest, AnAlarmThatFallsDueInABlockIsRepairedByUnblock)
{
    ZtTimerBeat::start();
    Beats(2);
    ZtTimerBeat::block();
    ASSERT_TRUE(alarm.Step());
    EXPECT_EQ(ZtTimerBeat::Statistics().beats, 2);
    ASSERT_FALSE(alarm.Armed());

    ZtTimerBeat::unblock();

    EXPECT_TRUE(alarm.Armed());
    EXPECT_EQ(alarm.Wait(), 1);
    Beats(1);
    EXPECT_EQ(ZtTimerBeat::Statistics().beats, 3);
    Beats(10);
}

TEST_F(ZtTimerBeatTest, AnAlarmThatIsNotDueIsLeftAloneByUnblock)
{
    ZtTimerBeat::start();
    ZtTimerBeat::block();
    clock.AdvanceMicroseconds(1500);

    ZtTimerBeat::unblock();

    EXPECT_EQ(alarm.Wait(), 4000);
    Beats(1);
    EXPECT_EQ(Milliseconds(), 4);
}

TEST_F(ZtTimerBeatTest, AnAlarmLostAfterStopIsRepairedForItsOneBeat)
{
    ZtTimerBeat::start();
    Beats(2);
    ZtTimerBeat::stop();
    ZtTimerBeat::block();
    ASSERT_TRUE(alarm.Step());

    ZtTimerBeat::unblock();

    Beats(1);
    EXPECT_EQ(ZtTimerBeat::Statistics().beats, 3);
    EXPECT_FALSE(alarm.Armed());
}

TEST_F(ZtTimerBeatTest, NothingIsRepairedWhenNoAlarmIsOwed)
{
    ZtTimerBeat::start();
    ZtTimerBeat::stop();
    Beats(1);

    ZtTimerBeat::block();
    ZtTimerBeat::unblock();

    EXPECT_FALSE(alarm.Armed());
}

TEST_F(ZtTimerBeatTest, AnAlarmThatWaitsUnderAMaskSurvivesABlock)
{
    sigset_t alarm_only;
    sigemptyset(&alarm_only);
    sigaddset(&alarm_only, SIGALRM);
    ZtTimerBeat::start();
    pthread_sigmask(SIG_BLOCK, &alarm_only, nullptr);
    ASSERT_TRUE(alarm.Step());

    // Ignoring a signal throws away the one that waits.
    ZtTimerBeat::block();
    ZtTimerBeat::unblock();
    pthread_sigmask(SIG_UNBLOCK, &alarm_only, nullptr);

    EXPECT_EQ(ZtTimerBeat::Statistics().beats, 0);
    Beats(1);
    EXPECT_EQ(ZtTimerBeat::Statistics().beats, 1);
}

TEST_F(ZtTimerBeatTest, AnAlarmThatStillWaitsIsNotSetTwice)
{
    sigset_t alarm_only;
    sigemptyset(&alarm_only);
    sigaddset(&alarm_only, SIGALRM);
    ZtTimerBeat::start();
    pthread_sigmask(SIG_BLOCK, &alarm_only, nullptr);
    ZtTimerBeat::block();
    ZtTimerBeat::blocked_count = 1;
    signal(SIGALRM, ZtTimerBeat::sigfunc);
    ASSERT_TRUE(alarm.Step());

    ZtTimerBeat::unblock();

    EXPECT_FALSE(alarm.Armed());
    pthread_sigmask(SIG_UNBLOCK, &alarm_only, nullptr);
    EXPECT_EQ(ZtTimerBeat::Statistics().beats, 1);
}

TEST_F(ZtTimerBeatTest, DangerIsUpDuringCallbacksOnlyAndTheBeatIsBlocked)
{
    static int danger, blocked;
    ZtTimerBeat::start();
    ZtTimer timer;
    timer.post_trigger(
        [](ZtTimer*, void*) {
            danger = ZtTimerBeat::danger;
            blocked = ZtTimerBeat::blocked_count;
        },
        nullptr, Ticks(0));
    timer.start();

    Beats(2);

    EXPECT_EQ(danger, 1);
    EXPECT_EQ(blocked, 1);
    EXPECT_EQ(ZtTimerBeat::danger, 0);
    EXPECT_EQ(ZtTimerBeat::blocked_count, 0);
}

TEST_F(ZtTimerBeatTest, ACallbackThatUnblocksDoesNotUpsetTheCount)
{
    ZtTimerBeat::start();
    const Handler handler = Disposition();
    ZtTimer timer;
    timer.post_repeat(
        [](ZtTimer*, void*) {
            ZtTimerBeat::block();
            ZtTimerBeat::unblock();
            ZtTimerBeat::unblock();
        },
        nullptr, 0);
    timer.start();

    Beats(5);

    EXPECT_EQ(ZtTimerBeat::blocked_count, 0);
    EXPECT_EQ(Disposition(), handler);
}

TEST_F(ZtTimerBeatTest, TheTimeOfTheBeatItselfIsTakenFromTheNextWait)
{
    static FakeClock* its_clock;
    its_clock = &clock;
    ZtTimerBeat::start();
    ZtTimer timer;
    timer.post_repeat(
        [](ZtTimer*, void*) { its_clock->AdvanceMicroseconds(1900); }, nullptr,
        0);
    timer.start();
    Beats(1);

    Beats(1);
    // 1900 microseconds are one whole millisecond.
    EXPECT_EQ(alarm.Wait(), 3000);
}

TEST_F(ZtTimerBeatTest, ABeatLongerThanThePeriodIsFollowedAtOnce)
{
    static FakeClock* its_clock;
    its_clock = &clock;
    ZtTimerBeat::start();
    ZtTimer timer;
    timer.post_repeat(
        [](ZtTimer*, void*) { its_clock->AdvanceMicroseconds(7000); }, nullptr,
        0);
    timer.start();
    Beats(1);

    Beats(3);

    EXPECT_EQ(alarm.Wait(), 1);
    EXPECT_EQ(ZtTimerBeat::Statistics().overruns, 3);
}

TEST_F(ZtTimerBeatTest, FireIsAnOrdinaryFunctionToo)
{
    ZtTimer timer;
    ZtTimerBeat::load();
    timer.start();
    ZtTimerBeat::fire(SIGALRM, 0, nullptr);
    clock.AdvanceMicroseconds(1000);

    ZtTimerBeat::fire(SIGALRM, 0, nullptr);

    EXPECT_EQ(timer.current, Ticks(6));
    EXPECT_FALSE(AlarmIsHeldBack());
    EXPECT_TRUE(alarm.Armed());
    EXPECT_EQ(alarm.Wait(), 4000);
}

TEST_F(ZtTimerBeatTest, FireByHandHoldsTheAlarmBackMeanwhile)
{
    static bool held_back;
    ZtTimerBeat::start();
    ZtTimer timer;
    timer.post_trigger([](ZtTimer*, void*) { held_back = AlarmIsHeldBack(); },
                       nullptr, Ticks(0));
    timer.start();
    ZtTimerBeat::fire(0, 0, nullptr);

    ZtTimerBeat::fire(0, 0, nullptr);

    EXPECT_TRUE(held_back);
    EXPECT_FALSE(AlarmIsHeldBack());
}

TEST_F(ZtTimerBeatTest, AnAlarmDueDuringAFireByHandIsNotLost)
{
    static FakeAlarm* its_alarm;
    its_alarm = &alarm;
    ZtTimerBeat::start();
    ZtTimerBeat::stop();
    ZtTimer timer;
    timer.post_trigger(
        [](ZtTimer* its, void*) {
            its_alarm->Step(); // raised, and waits
            its->force(Ticks(1));
        },
        nullptr, Ticks(0));
    timer.start();
    ZtTimerBeat::fire(0, 0, nullptr);

    // Carrying out the request ignores the signal and throws it away.
    ZtTimerBeat::fire(0, 0, nullptr);

    EXPECT_EQ(ZtTimerBeat::Statistics().beats, 0);
    Beats(1);
    EXPECT_EQ(ZtTimerBeat::Statistics().beats, 1);
}

TEST_F(ZtTimerBeatTest, AnAlarmThatACallbackLetsThroughIsLeftToItsOwnBeat)
{
    static int calls;
    calls = 0;
    ZtTimerBeat::start();
    ZtTimer timer;
    timer.post_repeat(
        [](ZtTimer*, void*) {
            ++calls;
            sigset_t alarm_only;
            sigemptyset(&alarm_only);
            sigaddset(&alarm_only, SIGALRM);
            pthread_sigmask(SIG_UNBLOCK, &alarm_only, nullptr);
            raise(SIGALRM);
        },
        nullptr, 0);
    timer.start();
    Beats(1);

    Beats(3);

    EXPECT_EQ(calls, 3);
    EXPECT_EQ(ZtTimerBeat::Statistics().beats, 4);
    EXPECT_EQ(ZtTimerBeat::danger, 0);
}

TEST_F(ZtTimerBeatTest, TheWallClockIsReadByLoadOnly)
{
    ZtTimerBeat::start();
    const KvoTime began = ZtTimerBeat::global_tm;

    clock.SetWall(5, 0);
    Beats(1);
    clock.SetWall(2000000000, 0);
    Beats(1);

    EXPECT_EQ(ZtTimerBeat::global_tm, began + Ticks(2 * 24));
}

TEST_F(ZtTimerBeatTest, RepeatsDoNotStallWhenTheWallClockIsSetBackAnHour)
{
    ZtTimerBeat::start();
    ZtTimer timer;
    timer.post_repeat(Note, Named("r"), 100);
    timer.start();
    alarm.Run(252000);

    clock.AdvanceMicroseconds(-3600L * 1000000);
    alarm.Run(200000);

    EXPECT_EQ(BeatLog::Moments("r"),
              (std::vector<std::int64_t>{100, 200, 300, 400}));
}

TEST_F(ZtTimerBeatTest, CheckTimerPrintsWhatIsLeft)
{
    ZtTimerBeat::reload(3500000);
    clock.AdvanceMicroseconds(250000);
    CapturedStderr captured;

    checktimer();

    EXPECT_EQ(captured.Text(), "Itimer 3 250000\n");
}

TEST_F(ZtTimerBeatTest, CheckTimerNeverThrows)
{
    const ThrowingStderr no_output;

    EXPECT_NO_THROW(checktimer());

    EXPECT_TRUE(std::cerr.bad());
}

TEST_F(ZtTimerBeatTest, ErrnoIsKeptForTheInterruptedCode)
{
    ZtTimerBeat::start();
    ZtTimer timer;
    timer.post_repeat([](ZtTimer*, void*) { errno = EDOM; }, nullptr, 0);
    timer.start();
    Beats(1);

    errno = ERANGE;
    alarm.Step();

    EXPECT_EQ(errno, ERANGE);
}

} // namespace
