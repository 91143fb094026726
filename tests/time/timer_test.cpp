#include "ZT/timer.h"

#include <new>
#include <type_traits>

#include "support/BeatTest.h"

namespace {

constexpr int ticks_a_beat = 24; // 4 ms

/// The beat runs, and all that a test asks for is carried out by `Beats`.
class ZtTimerTest : public BeatTest
{
protected:
    ZtTimerTest() { ZtTimerBeat::start(); }
};

KvoTime Ticks(int count)
{
    return KvoTime::FromTicks(count);
}

static_assert(!std::is_copy_constructible_v<ZtTimer>);
static_assert(!std::is_copy_assignable_v<ZtTimer>);
static_assert(!std::is_polymorphic_v<ZtTimer>);

TEST_F(ZtTimerTest, ADefaultTimerIsEndlessStandsAtZeroAndCountsUp)
{
    const int count = ZtTimer::tmr_count;
    ZtTimer timer;
    Beats(1);

    EXPECT_EQ(timer.id, count);
    EXPECT_EQ(timer.state, 2);
    EXPECT_EQ(timer.end_mode, 3);
    EXPECT_EQ(timer.counting_up, 1);
    EXPECT_EQ(timer.start_time, Ticks(0));
    EXPECT_EQ(timer.end, Ticks(3));
    EXPECT_EQ(timer.current, Ticks(0));
    EXPECT_EQ(timer.clock_at_start, Ticks(0));
    EXPECT_EQ(timer.position_at_start, Ticks(0));
    EXPECT_EQ(timer.callbacks, nullptr);
    EXPECT_EQ(timer.stop_callbacks, nullptr);
}

TEST_F(ZtTimerTest, ATimerBetweenTwoTimesStandsAtItsStart)
{
    ZtTimer up(Ticks(10), Ticks(50)), down(Ticks(50), Ticks(10));
    Beats(1);

    EXPECT_EQ(up.state, 2);
    EXPECT_EQ(up.end_mode, 0);
    EXPECT_EQ(up.counting_up, 1);
    EXPECT_EQ(up.start_time, Ticks(10));
    EXPECT_EQ(up.end, Ticks(50));
    EXPECT_EQ(up.current, Ticks(10));
    EXPECT_EQ(up.clock_at_start, Ticks(0));
    EXPECT_EQ(up.position_at_start, Ticks(0));
    EXPECT_EQ(up.callbacks, nullptr);
    EXPECT_EQ(up.stop_callbacks, nullptr);
    EXPECT_EQ(down.counting_up, 0);
    EXPECT_EQ(down.current, Ticks(50));
}

TEST_F(ZtTimerTest, EveryTimerGetsTheNextId)
{
    const int count = ZtTimer::tmr_count;
    int first_id, second_id;
    {
        ZtTimer first, second(Ticks(0), Ticks(9));
        Beats(1);
        first_id = first.id;
        second_id = second.id;
    }

    EXPECT_EQ(first_id, count);
    EXPECT_EQ(second_id, count + 1);
    EXPECT_EQ(ZtTimer::tmr_count, count + 2);
}

TEST_F(ZtTimerTest, AnEndOfThreeTicksEitherWayMeansEndless)
{
    ZtTimer three(Ticks(0), Ticks(3)), minus_three(Ticks(0), Ticks(-3));
    ZtTimer four(Ticks(0), Ticks(4)), two(Ticks(9), Ticks(2));
    ZtTimer minus_four(Ticks(0), Ticks(-4));
    Beats(1);

    EXPECT_EQ(three.end_mode, 3);
    EXPECT_EQ(minus_three.end_mode, 3);
    EXPECT_EQ(four.end_mode, 0);
    EXPECT_EQ(two.end_mode, 0);
    EXPECT_EQ(minus_four.end_mode, 0);
}

TEST_F(ZtTimerTest, EqualStartAndEndCountDown)
{
    ZtTimer timer(Ticks(50), Ticks(50));
    Beats(1);

    EXPECT_EQ(timer.counting_up, 0);
}

TEST_F(ZtTimerTest, IsDrivenFromTheNextBeatOn)
{
    ZtTimer timer;

    EXPECT_EQ(ZtTimerBeat::list_find(timer.id), nullptr);
    Beats(1);
    EXPECT_EQ(ZtTimerBeat::list_find(timer.id), &timer);
}

TEST_F(ZtTimerTest, MadeBeforeTheBeatStartsWaitsForIt)
{
    ZtTimerBeat::stop();
    Beats(1);
    ASSERT_FALSE(alarm.Armed());
    ZtTimer timer;
    timer.start();
    EXPECT_EQ(timer.state, ZtTimer::Stopped);

    ZtTimerBeat::start();
    Beats(2);

    EXPECT_EQ(timer.state, ZtTimer::Running);
    EXPECT_EQ(timer.current, Ticks(ticks_a_beat));
}

TEST_F(ZtTimerTest, FollowsTheClockWhileItRuns)
{
    ZtTimer up, down(Ticks(6000), Ticks(0));
    up.start();
    down.start();
    Beats(1);

    Beats(3);

    EXPECT_EQ(up.current, Ticks(3 * ticks_a_beat));
    EXPECT_EQ(down.current, Ticks(6000 - 3 * ticks_a_beat));
}

TEST_F(ZtTimerTest, FollowsTheRealTimeWhenBeatsAreLost)
{
    ZtTimer timer;
    timer.start();
    Beats(1);

    clock.AdvanceMicroseconds(500000);
    Beats(1);

    EXPECT_EQ(timer.current, Ticks(3000));
}

TEST_F(ZtTimerTest, ADefaultTimerNeverStopsByItself)
{
    ZtTimer timer;
    timer.start();
    Beats(1);

    clock.AdvanceMicroseconds(3600L * 1000000);
    Beats(1);

    EXPECT_EQ(timer.state, ZtTimer::Running);
    EXPECT_EQ(timer.current, KvoTime(1, 0, 0, 0));
}

TEST_F(ZtTimerTest, CountsDownFromTenSecondsAndStopsAtZero)
{
    ZtTimer timer(KvoTime(0, 0, 10, 0), KvoTime(0, 0, 0, 0));
    timer.start();
    Beats(1);

    alarm.Run(9999000);
    EXPECT_EQ(timer.state, ZtTimer::Running);
    EXPECT_GT(timer.current, Ticks(0));
    alarm.Run(8000);

    EXPECT_EQ(timer.state, ZtTimer::Stopped);
    EXPECT_EQ(timer.current, Ticks(0));
}

TEST_F(ZtTimerTest, IsClampedToItsEndWhenItRunsOver)
{
    ZtTimer timer(Ticks(0), Ticks(30));
    timer.start();
    Beats(1);

    Beats(1);
    EXPECT_EQ(timer.current, Ticks(24));
    EXPECT_EQ(timer.state, ZtTimer::Running);
    Beats(1);

    EXPECT_EQ(timer.current, Ticks(30));
    EXPECT_EQ(timer.state, ZtTimer::Stopped);
}

TEST_F(ZtTimerTest, StopsInTheBeatThatReachesTheEndExactly)
{
    ZtTimer up(Ticks(0), Ticks(48)), down(Ticks(48), Ticks(0));
    up.start();
    down.start();
    Beats(1);

    Beats(2);

    EXPECT_EQ(up.state, ZtTimer::Stopped);
    EXPECT_EQ(up.current, Ticks(48));
    EXPECT_EQ(down.state, ZtTimer::Stopped);
    EXPECT_EQ(down.current, Ticks(0));
}

TEST_F(ZtTimerTest, StartRunsOnFromTheCurrentTime)
{
    ZtTimer timer;
    timer.start();
    Beats(3);
    timer.stop();
    Beats(5);
    ASSERT_EQ(timer.current, Ticks(3 * ticks_a_beat));

    timer.start();
    Beats(2);

    EXPECT_EQ(timer.current, Ticks(4 * ticks_a_beat));
}

TEST_F(ZtTimerTest, StartOfARunningTimerDoesNothing)
{
    ZtTimer timer;
    timer.start();
    Beats(3);
    const KvoTime clock_at_start = timer.clock_at_start;

    timer.start();
    Beats(2);

    EXPECT_EQ(timer.clock_at_start, clock_at_start);
    EXPECT_EQ(timer.position_at_start, Ticks(0));
    EXPECT_EQ(timer.current, Ticks(4 * ticks_a_beat));
}

TEST_F(ZtTimerTest, RestartRunsFromTheStartAlsoARunningTimer)
{
    ZtTimer timer(Ticks(100), Ticks(100000));
    timer.start();
    Beats(5);

    timer.restart();
    Beats(1);
    EXPECT_EQ(timer.current, Ticks(100));
    EXPECT_EQ(timer.position_at_start, Ticks(100));
    EXPECT_EQ(timer.clock_at_start, ZtTimerBeat::global_tm);
    Beats(1);
    EXPECT_EQ(timer.current, Ticks(100 + ticks_a_beat));

    timer.stop();
    Beats(1);
    timer.restart();
    Beats(2);
    EXPECT_EQ(timer.current, Ticks(100 + ticks_a_beat));
    EXPECT_EQ(timer.state, ZtTimer::Running);
}

TEST_F(ZtTimerTest, StopLeavesItWhereItStood)
{
    ZtTimer timer;
    timer.start();
    Beats(2);

    timer.stop();
    Beats(4);

    EXPECT_EQ(timer.state, ZtTimer::Stopped);
    EXPECT_EQ(timer.current, Ticks(2 * ticks_a_beat));
}

TEST_F(ZtTimerTest, ForceIsSeenOnlyAfterTheBeat)
{
    ZtTimer timer;
    Beats(1);

    timer.force(Ticks(777));

    EXPECT_EQ(timer.current, Ticks(0));
    Beats(1);
    EXPECT_EQ(timer.current, Ticks(777));
}

TEST_F(ZtTimerTest, ForcingARunningTimerLetsItGoOnFromThere)
{
    ZtTimer timer;
    timer.start();
    Beats(3);

    timer.force(Ticks(1000));
    Beats(1);
    EXPECT_EQ(timer.current, Ticks(1000));
    EXPECT_EQ(timer.position_at_start, Ticks(1000));
    EXPECT_EQ(timer.clock_at_start, ZtTimerBeat::global_tm);
    Beats(1);

    EXPECT_EQ(timer.current, Ticks(1000 + ticks_a_beat));
}

TEST_F(ZtTimerTest, ForcingAStoppedTimerSetsItsTimeOnly)
{
    ZtTimer timer;
    Beats(1);

    timer.force(Ticks(1000));
    Beats(2);

    EXPECT_EQ(timer.current, Ticks(1000));
    EXPECT_EQ(timer.position_at_start, Ticks(0));
    EXPECT_EQ(timer.state, ZtTimer::Stopped);
}

TEST_F(ZtTimerTest, ReverseSwapsStartAndEndOfAStoppedTimer)
{
    ZtTimer timer(Ticks(10), Ticks(500));
    Beats(1);

    timer.reverse();
    EXPECT_EQ(timer.start_time, Ticks(10));
    Beats(1);

    EXPECT_EQ(timer.start_time, Ticks(500));
    EXPECT_EQ(timer.end, Ticks(10));
    EXPECT_EQ(timer.counting_up, 0);
    EXPECT_EQ(timer.current, Ticks(10));
}

TEST_F(ZtTimerTest, ReverseAndRestartRunFromTheOldEndToTheOldStart)
{
    ZtTimer timer(Ticks(10), Ticks(100));
    timer.reverse();
    timer.restart();
    Beats(1);
    EXPECT_EQ(timer.current, Ticks(100));

    Beats(1);
    EXPECT_EQ(timer.current, Ticks(100 - ticks_a_beat));
    Beats(4);

    EXPECT_EQ(timer.current, Ticks(10));
    EXPECT_EQ(timer.state, ZtTimer::Stopped);
}

TEST_F(ZtTimerTest, ReverseOfARunningTimerDoesNothing)
{
    ZtTimer timer(Ticks(10), Ticks(50000));
    timer.start();
    Beats(2);

    timer.reverse();

    EXPECT_EQ(ZtTimerBeat::defer_op_count, 0);
    Beats(1);
    EXPECT_EQ(timer.start_time, Ticks(10));
    EXPECT_EQ(timer.counting_up, 1);
}

TEST_F(ZtTimerTest, ReverseLooksAtTheStateWhenItIsAsked)
{
    ZtTimer timer(Ticks(10), Ticks(50000));
    Beats(1);

    timer.start();
    timer.reverse();
    Beats(1);

    EXPECT_EQ(timer.state, ZtTimer::Running);
    EXPECT_EQ(timer.start_time, Ticks(50000));
    EXPECT_EQ(timer.counting_up, 0);
}

TEST_F(ZtTimerTest, RequestsAreCarriedOutInTheOrderOfAsking)
{
    ZtTimer timer(Ticks(10), Ticks(50000));
    Beats(1);

    timer.force(Ticks(500));
    timer.start();
    timer.force(Ticks(900));
    timer.stop();
    timer.force(Ticks(901));
    Beats(1);

    EXPECT_EQ(timer.state, ZtTimer::Stopped);
    EXPECT_EQ(timer.current, Ticks(901));
    EXPECT_EQ(timer.position_at_start, Ticks(900));
}

TEST_F(ZtTimerTest, DestroyedInAnyStateItsSlotIsFreeAtOnce)
{
    for (const int state : {ZtTimer::Running, ZtTimer::Stopped}) {
        ZtTimer* const timer = new ZtTimer;
        Beats(1);
        if (state == ZtTimer::Running)
            timer->start();
        Beats(1);
        ASSERT_EQ(timer->state, state);
        const int id = timer->id;

        delete timer;

        EXPECT_EQ(ZtTimerBeat::list_find(id), nullptr);
        for (const ZtTimer* slot : ZtTimerBeat::timers)
            EXPECT_EQ(slot, nullptr);
    }
}

TEST_F(ZtTimerTest, DestroyedLeavesNothingQueuedBehind)
{
    alignas(ZtTimer) unsigned char room[sizeof(ZtTimer)];
    ZtTimer* const timer = new (room) ZtTimer;
    ZtTimer other;
    Beats(1);
    timer->post_trigger(Note, Named("dead"), Ticks(0));
    timer->start();
    timer->force(Ticks(5));
    other.start();

    timer->~ZtTimer();
    std::fill(room, room + sizeof room, static_cast<unsigned char>(0xA5));

    EXPECT_EQ(ZtTimerBeat::defer_op_count, 4);
    Beats(2);
    EXPECT_EQ(other.state, ZtTimer::Running);
    for (const unsigned char byte : room)
        EXPECT_EQ(byte, 0xA5);
    EXPECT_EQ(BeatLog::Texts(), "");
}

TEST_F(ZtTimerTest, DestroyingCallsNoStopCallback)
{
    ZtTimer* const timer = new ZtTimer;
    timer->post_stop(Note, Named("stop"));
    timer->start();
    Beats(2);

    delete timer;
    Beats(2);

    EXPECT_EQ(BeatLog::Texts(), "");
}

TEST_F(ZtTimerTest, RecordsOfADestroyedTimerAreUsedAgain)
{
    ZtTimer* const first = new ZtTimer;
    first->post_trigger(Note, nullptr, Ticks(0));
    first->post_stop(Note, nullptr);
    Beats(1);
    const ZtTimerCallbackInfo* const trigger = first->callbacks;
    const ZtTimerCallbackInfo* const stop = first->stop_callbacks;
    delete first;

    ZtTimer second;
    second.post_trigger(Note, nullptr, Ticks(0));
    second.post_stop(Note, nullptr);
    Beats(1);

    EXPECT_TRUE(second.callbacks == trigger || second.callbacks == stop);
    EXPECT_TRUE(second.stop_callbacks == trigger ||
                second.stop_callbacks == stop);
    EXPECT_NE(second.callbacks, second.stop_callbacks);
}

TEST_F(ZtTimerTest, ManyTimersOneAfterTheOtherAllGetASlot)
{
    BeatErrorTrap trap;

    for (int round = 0; round < 50; ++round) {
        ZtTimer timers[6];
        Beats(1);
        for (ZtTimer& timer : timers)
            ASSERT_EQ(ZtTimerBeat::list_find(timer.id), &timer);
    }

    EXPECT_EQ(trap.Text(), "");
}

} // namespace
