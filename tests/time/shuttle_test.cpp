// The transport as its callers see it: states, notifications, marked times,
// and what happens at the end of the range. Where it stands while it plays is
// in shuttle_position_test.cpp.

#include <ZT/shuttle.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <string>
#include <type_traits>
#include <vector>

#include <gtest/gtest.h>

#include "support/PrintTime.h"
#include "support/RecordingShuttle.h"
#include "support/SlotOf.h"

namespace {
using Lines = std::vector<std::string>;

} // namespace

TEST(ZtShuttle, NumbersOfStatesAndModes)
{
    EXPECT_EQ(static_cast<int>(ZtShuttle::FastReverse), 0);
    EXPECT_EQ(static_cast<int>(ZtShuttle::Reverse), 1);
    EXPECT_EQ(static_cast<int>(ZtShuttle::Stopped), 2);
    EXPECT_EQ(static_cast<int>(ZtShuttle::Play), 3);
    EXPECT_EQ(static_cast<int>(ZtShuttle::FastForward), 4);
    EXPECT_EQ(static_cast<int>(ZtShuttle::Once), 0);
    EXPECT_EQ(static_cast<int>(ZtShuttle::Loop), 1);
    EXPECT_EQ(static_cast<int>(ZtShuttle::Swing), 2);
    EXPECT_EQ(static_cast<int>(ZtShuttle::Continuous), 3);
}

TEST(ZtShuttle, VirtualOperationsStandInTheOrderThatPlugInsFind)
{
    const std::vector<std::ptrdiff_t> slots = {
        SlotOf(&ZtShuttle::Time),       SlotOf(&ZtShuttle::Go),
        SlotOf(&ZtShuttle::CancelGo),   SlotOf(&ZtShuttle::PrePlayNotify),
        SlotOf(&ZtShuttle::PlayNotify), SlotOf(&ZtShuttle::PostPlayNotify),
    };
    for (std::size_t index = 1; index < slots.size(); ++index)
        EXPECT_LT(slots[index - 1], slots[index]) << index;
    EXPECT_TRUE(std::has_virtual_destructor_v<ZtShuttle>);
}

TEST(ZtShuttle, StartsStoppedAtSpeedOneWithAllTimesZero)
{
    const FakeClock clock;

    ZtShuttle shuttle;

    EXPECT_EQ(shuttle.stopwatch.rate, 1.0);
    EXPECT_EQ(shuttle.offset, KvoTime::ZERO);
    EXPECT_EQ(shuttle.from, KvoTime::ZERO);
    EXPECT_EQ(shuttle.to, KvoTime::ZERO);
    EXPECT_EQ(shuttle.length, KvoTime::ZERO);
    EXPECT_EQ(shuttle.speed, 1.0f);
    EXPECT_EQ(shuttle.wraps, 0);
    for (const KvoTime time : shuttle.times)
        EXPECT_EQ(time, KvoTime::ZERO);
    EXPECT_EQ(shuttle.state, ZtShuttle::Stopped);
    EXPECT_EQ(shuttle.base_speed, 1.0f);
    EXPECT_EQ(shuttle.repeat_mode, ZtShuttle::Once);
    EXPECT_EQ(shuttle.playing, 0);
    EXPECT_EQ(shuttle.go_pending, 0);
    EXPECT_EQ(shuttle.listener, nullptr);
    EXPECT_EQ(shuttle.Time(), KvoTime::ZERO);
}

TEST(ZtShuttle, PlaysWithNobodyListening)
{
    FakeClock clock;
    ZtShuttle shuttle;
    shuttle.SetTime(KvoTime(0, 0, 10, 0), ZtShuttle::out_point, 1);

    shuttle.SetState(ZtShuttle::Play, 1);
    clock.AdvanceMicroseconds(2000000);
    const KvoTime in_play = shuttle.Time();
    clock.AdvanceMicroseconds(20000000);
    const KvoTime at_the_end = shuttle.Time();

    EXPECT_EQ(in_play, KvoTime(0, 0, 2, 0));
    EXPECT_EQ(at_the_end, KvoTime(0, 0, 10, 0));
    EXPECT_EQ(shuttle.state, ZtShuttle::Stopped);
}

// Setters.

TEST(ZtShuttle, SetTimeMarksEachOfTheFiveTimes)
{
    RecordingShuttle shuttle;
    for (int index = 0; index < 5; ++index)
        shuttle.SetTime(KvoTime(10 + index), index, 0);

    for (int index = 0; index < 5; ++index)
        EXPECT_EQ(shuttle.times[index], KvoTime(10 + index));
    EXPECT_EQ(shuttle.Time(), KvoTime(12));
}

TEST(ZtShuttle, SetTimeBringsIntoOneDay)
{
    RecordingShuttle shuttle;
    shuttle.SetTime(KvoTime(25, 0, 0, 0), ZtShuttle::out_point, 0);
    shuttle.SetTime(KvoTime::FromTicks(-1), ZtShuttle::in_point, 0);

    EXPECT_EQ(shuttle.times[4], KvoTime(1, 0, 0, 0));
    EXPECT_EQ(shuttle.times[0].Ticks(), 518399999);
}

TEST(ZtShuttle, SetTimeIgnoresAnIndexOutsideTheFive)
{
    RecordingShuttle shuttle;
    shuttle.Mark(1, 2, 3);

    for (const int index : {-1, 5, 1000000, INT32_MAX, INT32_MIN})
        shuttle.SetTime(KvoTime(9), index, 1);

    EXPECT_EQ(shuttle.times[0], KvoTime(0, 0, 1, 0));
    EXPECT_EQ(shuttle.times[4], KvoTime(0, 0, 3, 0));
    EXPECT_EQ(shuttle.log, Lines{});
}

TEST(ZtShuttle, SetTimeIsIgnoredWhilePlaying)
{
    RecordingShuttle shuttle;
    shuttle.Mark(0, 0, 10);
    shuttle.SetState(ZtShuttle::Play, 0);
    shuttle.log.clear();

    for (int index = 0; index < 5; ++index)
        shuttle.SetTime(KvoTime(0, 0, 7, 0), index, 1);

    EXPECT_EQ(shuttle.Time(), KvoTime::ZERO);
    EXPECT_EQ(shuttle.times[1], KvoTime::ZERO);
    EXPECT_EQ(shuttle.times[4], KvoTime(0, 0, 10, 0));
    EXPECT_EQ(shuttle.log, Lines{});
}

TEST(ZtShuttle, SettersTellTheListenerOnlyWhenAsked)
{
    RecordingShuttle shuttle;
    shuttle.SetTime(KvoTime(1), 0, 0);
    shuttle.SetSpeed(2.0f, 0);
    shuttle.SetRepeatMode(ZtShuttle::Loop, 0);
    EXPECT_EQ(shuttle.log, Lines{});

    shuttle.SetTime(KvoTime(1), 0, 1);
    shuttle.SetSpeed(2.0f, 7);
    shuttle.SetRepeatMode(ZtShuttle::Loop, -1);
    EXPECT_EQ(shuttle.log, (Lines{"changed", "changed", "changed"}));
}

TEST(ZtShuttle, SetStateTellsTheListenerOnlyWhenAsked)
{
    RecordingShuttle shuttle;
    shuttle.SetState(ZtShuttle::Play, 0);
    EXPECT_EQ(shuttle.log, (Lines{"pre 1 from 0 to 0", "play"}));

    shuttle.SetState(ZtShuttle::Stopped, 0);
    EXPECT_EQ(shuttle.log, (Lines{"pre 1 from 0 to 0", "play", "post"}));

    shuttle.log.clear();
    shuttle.SetState(ZtShuttle::Reverse, 1);
    EXPECT_EQ(shuttle.log, (Lines{"pre -1 from 0 to 0", "play", "changed"}));
}

TEST(ZtShuttle, SetSpeedTakesEffectAtTheNextChangeOfState)
{
    RecordingShuttle shuttle;
    shuttle.Mark(0, 0, 100);
    shuttle.SetState(ZtShuttle::Play, 0);

    shuttle.SetSpeed(3.0f, 0);

    EXPECT_EQ(shuttle.base_speed, 3.0f);
    EXPECT_EQ(shuttle.speed, 1.0f);
    EXPECT_TRUE(IsNear(shuttle.After(2), KvoTime(0, 0, 2, 0)));
    shuttle.SetState(ZtShuttle::FastForward, 0);
    EXPECT_EQ(shuttle.speed, 3.75f);
    EXPECT_TRUE(IsNear(shuttle.After(2), KvoTime(0, 0, 9, 15)));
}

TEST(ZtShuttle, SetRepeatModeTakesEffectAtOnce)
{
    RecordingShuttle shuttle;
    shuttle.Mark(0, 0, 10);
    shuttle.SetState(ZtShuttle::Play, 0);

    shuttle.SetRepeatMode(ZtShuttle::Swing, 0);

    shuttle.After(11);
    EXPECT_EQ(shuttle.state, ZtShuttle::Reverse);
}

TEST(ZtShuttle, TheSameStateAgainDoesNothingAndTellsNobody)
{
    RecordingShuttle shuttle;
    shuttle.Mark(0, 0, 10);
    shuttle.SetState(ZtShuttle::Play, 1);
    shuttle.After(3);
    shuttle.log.clear();

    shuttle.SetState(ZtShuttle::Play, 1);

    EXPECT_EQ(shuttle.log, Lines{});
    EXPECT_TRUE(IsNear(shuttle.After(1), KvoTime(0, 0, 4, 0)));
    shuttle.SetState(ZtShuttle::Stopped, 0);
    shuttle.log.clear();
    shuttle.SetState(ZtShuttle::Stopped, 1);
    EXPECT_EQ(shuttle.log, Lines{});
}

TEST(ZtShuttle, EachStateHasItsDirectionAndSpeed)
{
    RecordingShuttle shuttle;
    struct Case
    {
        ZtShuttle::StateType state;
        float speed;
        int from, to;
    };
    shuttle.SetSpeed(2.0f, 0);
    for (const Case& wanted : {Case{ZtShuttle::FastReverse, -2.5f, 30, 10},
                               Case{ZtShuttle::Reverse, -2.0f, 30, 10},
                               Case{ZtShuttle::Play, 2.0f, 10, 30},
                               Case{ZtShuttle::FastForward, 2.5f, 10, 30}}) {
        shuttle.Mark(10, 20, 30);
        shuttle.SetState(wanted.state, 0);

        EXPECT_EQ(shuttle.state, wanted.state);
        EXPECT_EQ(shuttle.speed, wanted.speed);
        EXPECT_EQ(shuttle.stopwatch.rate, std::fabs(wanted.speed));
        EXPECT_EQ(shuttle.from, KvoTime(0, 0, wanted.from, 0));
        EXPECT_EQ(shuttle.to, KvoTime(0, 0, wanted.to, 0));
        EXPECT_EQ(shuttle.playing, 1);
        EXPECT_TRUE(IsNear(shuttle.After(1),
                           KvoTime(KvoTime::seconds, 20 + wanted.speed)));
        shuttle.SetState(ZtShuttle::Stopped, 0);
    }
}

TEST(ZtShuttle, AStateThatDoesNotExistStops)
{
    RecordingShuttle shuttle;
    shuttle.Mark(0, 0, 10);
    shuttle.SetState(ZtShuttle::Play, 0);
    shuttle.log.clear();

    shuttle.SetState(static_cast<ZtShuttle::StateType>(7), 1);

    EXPECT_EQ(static_cast<int>(shuttle.state), 7);
    EXPECT_EQ(shuttle.playing, 0);
    EXPECT_EQ(shuttle.log, (Lines{"post", "changed"}));
}

TEST(ZtShuttle, TheListenerIsToldWhichShuttleChanged)
{
    RecordingShuttle shuttle;
    ZtShuttle* told = nullptr;
    shuttle.on_change = [&](ZtShuttle* changed) { told = changed; };

    shuttle.SetSpeed(2.0f, 1);

    EXPECT_EQ(told, &shuttle);
}

// Starting and stopping.

TEST(ZtShuttle, AStartTellsTheSubclassSpeedAndRange)
{
    RecordingShuttle shuttle;
    shuttle.Mark(10, 20, 30);

    shuttle.SetState(ZtShuttle::Play, 1);
    shuttle.SetState(ZtShuttle::FastReverse, 1);

    EXPECT_EQ(shuttle.log,
              (Lines{"pre 1 from 20 to 30", "play", "changed", "post",
                     "pre -1.25 from 20 to 10", "play", "changed"}));
}

TEST(ZtShuttle, AStartAtSpeedZeroTellsTheOutPoint)
{
    RecordingShuttle shuttle;
    shuttle.Mark(10, 20, 30);
    shuttle.SetSpeed(0.0f, 0);

    shuttle.SetState(ZtShuttle::Play, 0);
    shuttle.SetState(ZtShuttle::Stopped, 0);
    shuttle.SetTime(KvoTime(0, 0, 20, 0), ZtShuttle::current_time, 0);
    shuttle.SetState(ZtShuttle::Reverse, 0);

    EXPECT_EQ(shuttle.log, (Lines{"pre 0 from 20 to 30", "play", "post",
                                  "pre -0 from 20 to 30", "play"}));
}

TEST(ZtShuttle, PlayBeginsAfterItsNotification)
{
    RecordingShuttle shuttle;
    shuttle.Mark(0, 0, 10);
    shuttle.clock.AdvanceMicroseconds(5000000);
    int playing = -1;
    int pending = -1;
    double reading = -1;
    int state = -1;
    shuttle.on_play = [&] {
        playing = shuttle.playing;
        pending = shuttle.go_pending;
        reading = shuttle.stopwatch.Split();
        state = shuttle.state;
    };

    shuttle.SetState(ZtShuttle::Play, 0);

    EXPECT_EQ(playing, 0);
    EXPECT_EQ(pending, 1);
    EXPECT_EQ(reading, 0.0);
    EXPECT_EQ(state, ZtShuttle::Stopped);
    EXPECT_EQ(shuttle.playing, 1);
    EXPECT_EQ(shuttle.go_pending, 0);
    EXPECT_EQ(shuttle.state, ZtShuttle::Play);
}

TEST(ZtShuttle, PlayEndsBeforeItsNotificationAndIsThenFixed)
{
    RecordingShuttle shuttle;
    shuttle.Mark(0, 0, 10);
    shuttle.SetState(ZtShuttle::Play, 0);
    int playing = -1;
    KvoTime stored;
    shuttle.on_post = [&] {
        playing = shuttle.playing;
        stored = shuttle.times[2];
    };
    shuttle.clock.AdvanceMicroseconds(3000000);

    shuttle.SetState(ZtShuttle::Stopped, 0);

    EXPECT_EQ(playing, 0);
    EXPECT_EQ(stored, KvoTime::ZERO);
    EXPECT_EQ(shuttle.times[2], KvoTime(0, 0, 3, 0));
    EXPECT_EQ(shuttle.After(5), KvoTime(0, 0, 3, 0));
}

TEST(ZtShuttle, AStartWhilePlayingDoesNothing)
{
    RecordingShuttle shuttle;
    shuttle.Mark(0, 0, 10);
    shuttle.SetState(ZtShuttle::Play, 0);
    shuttle.After(3);
    shuttle.log.clear();

    shuttle.start_playback();

    EXPECT_EQ(shuttle.log, Lines{});
    EXPECT_EQ(shuttle.offset, KvoTime::ZERO);
    EXPECT_EQ(shuttle.Time(), KvoTime(0, 0, 3, 0));
}

TEST(ZtShuttle, AStopWithoutPlayDoesNothing)
{
    RecordingShuttle shuttle;
    shuttle.Mark(0, 5, 10);

    shuttle.stop_playback();

    EXPECT_EQ(shuttle.log, Lines{});
    EXPECT_EQ(shuttle.Time(), KvoTime(0, 0, 5, 0));
}

TEST(ZtShuttle, ADelayedGoStartsWhenTheSubclassSaysSo)
{
    RecordingShuttle shuttle;
    shuttle.Mark(0, 0, 10);
    shuttle.delays_go = true;

    shuttle.SetState(ZtShuttle::Play, 1);

    EXPECT_EQ(shuttle.log,
              (Lines{"pre 1 from 0 to 10", "go delayed", "changed"}));
    EXPECT_EQ(shuttle.state, ZtShuttle::Play);
    EXPECT_EQ(shuttle.go_pending, 1);
    EXPECT_EQ(shuttle.playing, 0);
    EXPECT_EQ(shuttle.After(5), KvoTime::ZERO);
    shuttle.GoNow();
    EXPECT_EQ(shuttle.log.back(), "play");
    EXPECT_TRUE(IsNear(shuttle.After(2), KvoTime(0, 0, 2, 0)));
}

TEST(ZtShuttle, GoWithNothingPendingDoesNothing)
{
    RecordingShuttle shuttle;
    shuttle.Mark(0, 0, 10);

    shuttle.GoNow();
    EXPECT_EQ(shuttle.log, Lines{});
    EXPECT_EQ(shuttle.playing, 0);

    shuttle.SetState(ZtShuttle::Play, 0);
    shuttle.After(3);
    shuttle.log.clear();
    shuttle.GoNow();
    EXPECT_EQ(shuttle.log, Lines{});
    EXPECT_EQ(shuttle.Time(), KvoTime(0, 0, 3, 0));
}

TEST(ZtShuttle, CancelGoAbandonsAPendingGo)
{
    RecordingShuttle shuttle;
    shuttle.delays_go = true;
    shuttle.SetState(ZtShuttle::Play, 0);
    shuttle.log.clear();
    int pending = -1;
    shuttle.on_post = [&] { pending = shuttle.go_pending; };

    shuttle.CancelGo();
    shuttle.GoNow();
    shuttle.CancelGo();

    EXPECT_EQ(shuttle.log, Lines{"post"});
    EXPECT_EQ(pending, 1);
    EXPECT_EQ(shuttle.go_pending, 0);
    EXPECT_EQ(shuttle.playing, 0);
}

TEST(ZtShuttle, CancelGoLeavesTheState)
{
    RecordingShuttle shuttle;
    shuttle.delays_go = true;
    shuttle.SetState(ZtShuttle::Play, 0);

    shuttle.CancelGo();
    EXPECT_EQ(shuttle.state, ZtShuttle::Play);
    shuttle.SetState(ZtShuttle::Stopped, 0);
    EXPECT_EQ(shuttle.state, ZtShuttle::Stopped);

    shuttle.SetState(ZtShuttle::Play, 0);
    shuttle.SetState(ZtShuttle::Stopped, 0);
    EXPECT_EQ(shuttle.go_pending, 1);
}

TEST(ZtShuttle, CancelGoWithNothingPendingDoesNothing)
{
    RecordingShuttle shuttle;
    shuttle.SetState(ZtShuttle::Play, 0);
    shuttle.log.clear();

    shuttle.CancelGo();

    EXPECT_EQ(shuttle.log, Lines{});
    EXPECT_EQ(shuttle.playing, 1);
}

TEST(ZtShuttle, AnotherStateWhileAGoIsPendingPreparesAnewAndAsksNoSecondGo)
{
    RecordingShuttle shuttle;
    shuttle.Mark(10, 20, 30);
    shuttle.delays_go = true;
    shuttle.SetState(ZtShuttle::Play, 0);
    shuttle.log.clear();

    shuttle.SetState(ZtShuttle::Reverse, 0);

    EXPECT_EQ(shuttle.log, Lines{"pre -1 from 20 to 10"});
    EXPECT_EQ(shuttle.go_pending, 1);
    shuttle.GoNow();
    EXPECT_TRUE(IsNear(shuttle.After(3), KvoTime(0, 0, 17, 0)));
}

TEST(ZtShuttle, MarkedTimesMayChangeWhileAGoIsPending)
{
    RecordingShuttle shuttle;
    shuttle.Mark(0, 0, 10);
    shuttle.delays_go = true;
    shuttle.SetState(ZtShuttle::Play, 0);

    shuttle.SetTime(KvoTime(0, 0, 4, 0), ZtShuttle::current_time, 0);

    EXPECT_EQ(shuttle.Time(), KvoTime(0, 0, 4, 0));
}

// The end of the range.

TEST(ZtShuttle, TheEndIsNoticedOnlyWhenTheTimeIsAsked)
{
    RecordingShuttle shuttle;
    shuttle.Mark(0, 0, 10);
    shuttle.SetState(ZtShuttle::Play, 0);
    shuttle.log.clear();

    shuttle.clock.AdvanceMicroseconds(60000000);
    EXPECT_EQ(shuttle.log, Lines{});
    EXPECT_EQ(shuttle.playing, 1);

    shuttle.Time();
    EXPECT_EQ(shuttle.log, (Lines{"post", "changed"}));
    EXPECT_EQ(shuttle.playing, 0);
}

TEST(ZtShuttle, OnceStopsExactlyAtTheOutPointWhateverTheOvershoot)
{
    for (const double overshoot : {0.0002, 0.5, 100.0, 1e5}) {
        RecordingShuttle shuttle;
        shuttle.Mark(3, 3, 13);
        shuttle.SetState(ZtShuttle::FastForward, 0);

        EXPECT_EQ(shuttle.After(8 + overshoot), KvoTime(0, 0, 13, 0));
        EXPECT_EQ(shuttle.state, ZtShuttle::Stopped);
        EXPECT_EQ(shuttle.playing, 0);
    }
}

TEST(ZtShuttle, OnceStopsExactlyAtTheInPointWhenPlayedBackward)
{
    for (const auto state : {ZtShuttle::Reverse, ZtShuttle::FastReverse}) {
        RecordingShuttle shuttle;
        shuttle.Mark(3, 13, 13);
        shuttle.SetState(state, 0);

        EXPECT_EQ(shuttle.After(11), KvoTime(0, 0, 3, 0));
        EXPECT_EQ(shuttle.state, ZtShuttle::Stopped);
    }
}

TEST(ZtShuttle, OnceTellsTheListenerBeforeTheFinalTime)
{
    RecordingShuttle shuttle;
    shuttle.Mark(0, 0, 10);
    shuttle.SetState(ZtShuttle::Play, 0);
    shuttle.After(9);
    KvoTime told;
    int state = -1;
    shuttle.on_change = [&](ZtShuttle* changed) {
        told = changed->Time();
        state = changed->state;
    };

    const KvoTime final_time = shuttle.After(2);

    EXPECT_TRUE(IsNear(told, KvoTime(0, 0, 9, 0)));
    EXPECT_EQ(state, ZtShuttle::Stopped);
    EXPECT_EQ(final_time, KvoTime(0, 0, 10, 0));
}

TEST(ZtShuttle, LoopJumpsBackAndPlaysOnInTheSameState)
{
    struct Case
    {
        ZtShuttle::StateType state;
        int start;
        const char* prepared;
    };
    for (const Case& each :
         {Case{ZtShuttle::Play, 10, "pre 1 from 10 to 20"},
          Case{ZtShuttle::FastForward, 10, "pre 1.25 from 10 to 20"},
          Case{ZtShuttle::Reverse, 20, "pre -1 from 20 to 10"},
          Case{ZtShuttle::FastReverse, 20, "pre -1.25 from 20 to 10"}}) {
        RecordingShuttle shuttle;
        shuttle.Mark(10, 15, 20);
        shuttle.SetRepeatMode(ZtShuttle::Loop, 0);
        shuttle.SetState(each.state, 0);
        shuttle.log.clear();

        const KvoTime at_the_end = shuttle.After(7);

        EXPECT_EQ(at_the_end, KvoTime(0, 0, each.start, 0));
        EXPECT_EQ(shuttle.log,
                  (Lines{"post", each.prepared, "play", "changed"}));
        EXPECT_EQ(shuttle.state, each.state);
        EXPECT_EQ(shuttle.playing, 1);
        EXPECT_TRUE(
            IsNear(shuttle.After(2),
                   KvoTime(KvoTime::seconds, static_cast<float>(each.start) +
                                                 2 * shuttle.speed)));
    }
}

TEST(ZtShuttle, LoopGoesOnRoundAfterRound)
{
    RecordingShuttle shuttle;
    shuttle.Mark(0, 0, 10);
    shuttle.SetRepeatMode(ZtShuttle::Loop, 0);
    shuttle.SetState(ZtShuttle::Play, 0);

    for (int round = 0; round < 100; ++round) {
        EXPECT_EQ(shuttle.After(10.5), KvoTime::ZERO);
        EXPECT_TRUE(IsNear(shuttle.After(9), KvoTime(0, 0, 9, 0)));
    }
}

TEST(ZtShuttle, SwingTurnsRoundAtEachEnd)
{
    RecordingShuttle shuttle;
    shuttle.Mark(10, 10, 20);
    shuttle.SetRepeatMode(ZtShuttle::Swing, 0);
    shuttle.SetState(ZtShuttle::Play, 0);
    shuttle.log.clear();

    EXPECT_EQ(shuttle.After(11), KvoTime(0, 0, 20, 0));
    EXPECT_EQ(shuttle.state, ZtShuttle::Reverse);
    EXPECT_TRUE(IsNear(shuttle.After(4), KvoTime(0, 0, 16, 0)));
    EXPECT_EQ(shuttle.After(7), KvoTime(0, 0, 10, 0));
    EXPECT_EQ(shuttle.state, ZtShuttle::Play);
    EXPECT_TRUE(IsNear(shuttle.After(4), KvoTime(0, 0, 14, 0)));
    EXPECT_EQ(shuttle.log,
              (Lines{"post", "pre -1 from 20 to 10", "play", "changed", "post",
                     "pre 1 from 10 to 20", "play", "changed"}));
}

TEST(ZtShuttle, SwingKeepsTheFastRate)
{
    RecordingShuttle shuttle;
    shuttle.Mark(10, 10, 20);
    shuttle.SetSpeed(2.0f, 0);
    shuttle.SetRepeatMode(ZtShuttle::Swing, 0);
    shuttle.SetState(ZtShuttle::FastForward, 0);

    shuttle.After(4.5);
    EXPECT_EQ(shuttle.state, ZtShuttle::FastReverse);
    EXPECT_EQ(shuttle.speed, -2.5f);
    shuttle.After(4.5);
    EXPECT_EQ(shuttle.state, ZtShuttle::FastForward);
    EXPECT_EQ(shuttle.speed, 2.5f);
}

TEST(ZtShuttle, TheListenerMayAskTheTimeAtEveryEnd)
{
    for (const auto mode :
         {ZtShuttle::Once, ZtShuttle::Loop, ZtShuttle::Swing}) {
        RecordingShuttle shuttle;
        shuttle.Mark(0, 0, 10);
        shuttle.SetRepeatMode(mode, 0);
        shuttle.SetState(ZtShuttle::Play, 0);
        shuttle.on_change = [](ZtShuttle* changed) { changed->Time(); };
        shuttle.on_post = [&] { shuttle.Time(); };
        shuttle.log.clear();

        shuttle.After(11);

        EXPECT_EQ(std::count(shuttle.log.begin(), shuttle.log.end(), "changed"),
                  1)
            << mode;
    }
}

TEST(ZtShuttle, AnEndReachedInsideAnotherIsLeftToTheNextQuestion)
{
    RecordingShuttle shuttle;
    RecordingShuttle other;
    shuttle.Mark(0, 0, 10);
    other.Mark(0, 0, 5);
    shuttle.SetState(ZtShuttle::Play, 0);
    other.SetState(ZtShuttle::Play, 0);
    // The clock built last is the one both read.
    other.clock.AdvanceMicroseconds(4000000);
    other.Time();
    KvoTime seen;
    int state = -1;
    shuttle.on_change = [&](ZtShuttle*) {
        seen = other.Time();
        state = other.state;
    };

    other.clock.AdvanceMicroseconds(20000000);
    shuttle.Time();

    EXPECT_TRUE(IsNear(seen, KvoTime(0, 0, 4, 0)));
    EXPECT_EQ(state, ZtShuttle::Play);
    EXPECT_EQ(other.Time(), KvoTime(0, 0, 5, 0));
    EXPECT_EQ(other.state, ZtShuttle::Stopped);
}

TEST(ZtShuttle, AHostThatThrowsOutOfItsListenerLeavesTheNextEndWorking)
{
    RecordingShuttle shuttle;
    shuttle.Mark(0, 0, 10);
    shuttle.SetState(ZtShuttle::Play, 0);
    shuttle.on_change = [](ZtShuttle*) { throw 1; };
    EXPECT_THROW(shuttle.After(11), int);
    shuttle.on_change = nullptr;

    RecordingShuttle next;
    next.Mark(0, 0, 10);
    next.SetState(ZtShuttle::Play, 0);

    EXPECT_EQ(next.After(11), KvoTime(0, 0, 10, 0));
    EXPECT_EQ(next.state, ZtShuttle::Stopped);
}

TEST(ZtShuttle, AStopThatFindsTheEndPassedHandlesItFirst)
{
    RecordingShuttle shuttle;
    shuttle.Mark(0, 0, 10);
    shuttle.SetState(ZtShuttle::Play, 0);
    shuttle.log.clear();
    shuttle.clock.AdvanceMicroseconds(11000000);

    shuttle.SetState(ZtShuttle::Stopped, 1);

    EXPECT_EQ(shuttle.log, (Lines{"post", "changed", "changed"}));
    EXPECT_EQ(shuttle.Time(), KvoTime(0, 0, 10, 0));
    EXPECT_EQ(shuttle.state, ZtShuttle::Stopped);
}

TEST(ZtShuttle, AStopAlwaysStopsALoopWhoseEndHadPassed)
{
    RecordingShuttle shuttle;
    shuttle.Mark(0, 0, 10);
    shuttle.SetRepeatMode(ZtShuttle::Loop, 0);
    shuttle.SetState(ZtShuttle::Play, 0);
    shuttle.log.clear();
    shuttle.clock.AdvanceMicroseconds(11000000);

    shuttle.SetState(ZtShuttle::Stopped, 0);

    EXPECT_EQ(shuttle.log,
              (Lines{"post", "pre 1 from 0 to 10", "play", "changed", "post"}));
    EXPECT_EQ(shuttle.state, ZtShuttle::Stopped);
    EXPECT_EQ(shuttle.playing, 0);
    EXPECT_EQ(shuttle.After(5), KvoTime::ZERO);
}

TEST(ZtShuttle, AStopAlwaysStopsASwingWhoseEndHadPassed)
{
    RecordingShuttle shuttle;
    shuttle.Mark(0, 0, 10);
    shuttle.SetRepeatMode(ZtShuttle::Swing, 0);
    shuttle.SetState(ZtShuttle::Play, 0);
    shuttle.clock.AdvanceMicroseconds(11000000);

    shuttle.SetState(ZtShuttle::Stopped, 0);

    EXPECT_EQ(shuttle.state, ZtShuttle::Stopped);
    EXPECT_EQ(shuttle.playing, 0);
    EXPECT_EQ(shuttle.After(5), KvoTime(0, 0, 10, 0));
}

TEST(ZtShuttle, AChangeOfStateAfterTheEndOfALoopStartsFromItsJump)
{
    RecordingShuttle shuttle;
    shuttle.Mark(10, 10, 20);
    shuttle.SetRepeatMode(ZtShuttle::Loop, 0);
    shuttle.SetState(ZtShuttle::Play, 0);
    shuttle.clock.AdvanceMicroseconds(11000000);

    shuttle.SetState(ZtShuttle::FastForward, 0);

    EXPECT_EQ(shuttle.state, ZtShuttle::FastForward);
    EXPECT_EQ(shuttle.playing, 1);
    EXPECT_TRUE(IsNear(shuttle.After(4), KvoTime(0, 0, 15, 0)));
}

TEST(ZtShuttle, AClockSetBackEndsTheRange)
{
    RecordingShuttle once;
    once.Mark(0, 0, 10);
    once.SetState(ZtShuttle::Play, 0);
    EXPECT_EQ(once.After(-3600), KvoTime(0, 0, 10, 0));
    EXPECT_EQ(once.state, ZtShuttle::Stopped);

    RecordingShuttle loop;
    loop.Mark(0, 5, 10);
    loop.SetRepeatMode(ZtShuttle::Loop, 0);
    loop.SetState(ZtShuttle::Play, 0);
    EXPECT_EQ(loop.After(-3600), KvoTime::ZERO);
    EXPECT_TRUE(IsNear(loop.After(2), KvoTime(0, 0, 2, 0)));
}
