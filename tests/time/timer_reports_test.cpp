#include <csignal>
#include <new>

#include "support/BeatTest.h"
#include "support/CapturedStderr.h"

namespace {

constexpr char too_many[] = "Error: Too many timers in ZtTimerBeat.\n";
constexpr char not_found[] = "Error: Failed to find timer in ZtTimerBeat.\n";

class TimerReports : public BeatTest
{
protected:
    TimerReports() { ZtTimerBeat::start(); }
};

TEST_F(TimerReports, TheSeventhTimerIsReportedAtTheNextBeat)
{
    BeatErrorTrap trap;
    ZtTimer timers[6];
    Beats(1);
    {
        ZtTimer seventh;
        EXPECT_EQ(trap.count, 0);
        const int count_before = ZtErr::count;

        Beats(1);

        EXPECT_EQ(trap.Text(), too_many);
        EXPECT_EQ(trap.errors[0]->level, 4);
        EXPECT_EQ(trap.errors[0]->code, 0);
        EXPECT_EQ(ZtErr::count, count_before + 1);
        Beats(1);
        EXPECT_EQ(trap.count, 1);
    }
    EXPECT_EQ(trap.Text(), std::string(too_many) + not_found);
}

TEST_F(TimerReports, APushedHandlerSeesItInThatBeatBeforeWhatFollowsInTheQueue)
{
    class Order : public BeatErrorTrap
    {
    public:
        void Handle(ZtErr* error) override
        {
            Note(nullptr, Named("report "));
            danger = ZtTimerBeat::danger;
            BeatErrorTrap::Handle(error);
        }
        int danger = -1;
    };
    Order trap;
    ZtTimer timers[6];
    timers[0].post_stop(Note, Named("stop "));
    Beats(1);
    timers[0].start();
    {
        ZtTimer seventh;
        timers[0].stop();

        Beats(1);
    }

    EXPECT_EQ(BeatLog::Texts(), "report stop report ");
    EXPECT_EQ(trap.danger, 0);
}

TEST_F(TimerReports, TheSeventhTimerWorksOnButStandsStill)
{
    BeatErrorTrap trap;
    ZtTimer timers[6];
    ZtTimer seventh;
    seventh.post_stop(Note, Named("s"));
    seventh.post_repeat(Note, Named("never"), 0);
    seventh.start();
    Beats(5);

    EXPECT_EQ(seventh.state, ZtTimer::Running);
    EXPECT_EQ(seventh.current, KvoTime::ZERO);
    seventh.stop();
    Beats(1);
    EXPECT_EQ(BeatLog::Texts(), "s");
}

TEST_F(TimerReports, WithoutAPushedHandlerItIsPrinted)
{
    ZtTimer timers[6];
    auto* const seventh = new ZtTimer;
    CapturedStderr captured;

    Beats(1);
    EXPECT_EQ(captured.Text(), too_many);
    delete seventh;

    EXPECT_EQ(captured.Text(), std::string(too_many) + not_found);
}

TEST_F(TimerReports, AHandlerThatHoldsGetsItInItsQueue)
{
    BeatErrorTrap trap;
    trap.Hold();
    ZtTimer timers[6];
    auto* const seventh = new ZtTimer;
    ZtWarning("before\n");

    Beats(1);
    delete seventh;

    EXPECT_EQ(trap.count, 0);
    trap.Release();
    EXPECT_EQ(trap.Text(),
              std::string("Warning: before\n") + too_many + not_found);
}

TEST_F(TimerReports, ManyMoreTimersAreEachReported)
{
    BeatErrorTrap trap;
    {
        ZtTimer timers[6];
        Beats(1);
        ZtTimer more[40];

        Beats(1);
        EXPECT_EQ(trap.count, 40);
    }

    EXPECT_EQ(trap.count, 80);
}

TEST_F(TimerReports, DestroyedBeforeItsFirstBeatItIsReportedAsNotFound)
{
    BeatErrorTrap trap;
    {
        ZtTimer timer;
    }

    EXPECT_EQ(trap.Text(), not_found);
    Beats(2);
    EXPECT_EQ(trap.Text(), not_found);
    for (const ZtTimer* slot : ZtTimerBeat::timers)
        EXPECT_EQ(slot, nullptr);
}

TEST_F(TimerReports, DestroyedInItsSlotItIsNotReported)
{
    BeatErrorTrap trap;
    {
        ZtTimer timer;
        Beats(1);
    }

    EXPECT_EQ(trap.Text(), "");
}

TEST_F(TimerReports, ATimerInNoSlotDestroyedInTheBeatIsReportedInTheBeat)
{
    alignas(ZtTimer) static unsigned char room[sizeof(ZtTimer)];
    static bool reported_inside;
    class Inside : public BeatErrorTrap
    {
    public:
        void Handle(ZtErr* error) override
        {
            reported_inside = ZtTimerBeat::danger;
            BeatErrorTrap::Handle(error);
        }
    };
    Inside trap;
    ZtTimer timer;
    auto* const victim = new (room) ZtTimer;
    Beats(1);
    ZtTimerBeat::tmr_destroy(victim);
    timer.post_trigger(
        [](ZtTimer*, void* data) { static_cast<ZtTimer*>(data)->~ZtTimer(); },
        victim, KvoTime::ZERO);
    timer.start();

    Beats(2);

    EXPECT_EQ(trap.Text(), not_found);
    EXPECT_TRUE(reported_inside);
}

TEST_F(TimerReports, ATimerThatIsAddedTwiceWithoutRoomIsReportedTwice)
{
    BeatErrorTrap trap;
    ZtTimer timers[6];
    Beats(1);

    ZtTimerBeat::tmr_add(&timers[0]);
    ZtTimerBeat::tmr_add(&timers[0]);
    Beats(1);

    EXPECT_EQ(trap.count, 2);
}

TEST_F(TimerReports, AtTheAbortLevelTheBeatEndsTheProcessDeath)
{
    EXPECT_EXIT(
        {
            ZtErrHandler::abortLevel = 4;
            auto* const timers = new ZtTimer[7];
            (void)timers;
            alarm.Step();
        },
        testing::KilledBySignal(SIGABRT),
        "^Error: Too many timers in ZtTimerBeat.\n$");
}

} // namespace
