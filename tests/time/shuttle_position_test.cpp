// Where a transport stands: the range it plays, also through midnight, how far
// into it play begins, and the time that comes out of the clock.

#include <ZT/shuttle.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <limits>
#include <random>
#include <vector>

#include <gtest/gtest.h>

#include "support/DefaultRate.h"
#include "support/PrintTime.h"
#include "support/RecordingShuttle.h"

namespace {
constexpr std::int32_t day = 518400000;

/// What a start works out.
struct Start
{
    int wraps;
    std::int32_t length;
    std::int32_t offset;

    friend bool operator==(const Start& a, const Start& b)
    {
        return a.wraps == b.wraps && a.length == b.length &&
               a.offset == b.offset;
    }

    friend std::ostream& operator<<(std::ostream& out, const Start& start)
    {
        return out << "wraps " << start.wraps << " length " << start.length
                   << " offset " << start.offset;
    }
};

/// Starts play with the points given in hours.
Start StartAt(ZtShuttle::StateType state, int in, int current, int out,
              float base_speed = 1.0f)
{
    RecordingShuttle shuttle;
    shuttle.SetTime(KvoTime(in, 0, 0, 0), 0, 0);
    shuttle.SetTime(KvoTime(current, 0, 0, 0), 2, 0);
    shuttle.SetTime(KvoTime(out, 0, 0, 0), 4, 0);
    shuttle.SetSpeed(base_speed, 0);
    shuttle.SetState(state, 0);
    return {shuttle.wraps, shuttle.length.Ticks(), shuttle.offset.Ticks()};
}

constexpr std::int32_t Hours(int hours)
{
    return hours * 21600000;
}
} // namespace

TEST(ZtShuttle, PlayForwardBeginsInsideTheRangeOrAtItsStart)
{
    const auto start = [](int current) {
        return StartAt(ZtShuttle::Play, 2, current, 5);
    };

    EXPECT_EQ(start(1), (Start{0, Hours(3), 0}));
    EXPECT_EQ(start(2), (Start{0, Hours(3), 0}));
    EXPECT_EQ(start(3), (Start{0, Hours(3), Hours(1)}));
    EXPECT_EQ(start(5), (Start{0, Hours(3), Hours(3)}));
    EXPECT_EQ(start(6), (Start{0, Hours(3), 0}));
}

TEST(ZtShuttle, PlayForwardThroughMidnightBeginsOnEitherSide)
{
    const auto start = [](int current) {
        return StartAt(ZtShuttle::Play, 22, current, 3);
    };

    EXPECT_EQ(start(21), (Start{1, Hours(5), 0}));
    EXPECT_EQ(start(22), (Start{1, Hours(5), 0}));
    EXPECT_EQ(start(23), (Start{1, Hours(5), Hours(1)}));
    EXPECT_EQ(start(0), (Start{1, Hours(5), Hours(2)}));
    EXPECT_EQ(start(3), (Start{1, Hours(5), Hours(5)}));
    EXPECT_EQ(start(4), (Start{1, Hours(5), 0}));
}

TEST(ZtShuttle, PlayBackwardBeginsInsideTheRangeOrAtItsStart)
{
    const auto start = [](int current) {
        return StartAt(ZtShuttle::Reverse, 2, current, 5);
    };

    EXPECT_EQ(start(1), (Start{0, Hours(3), 0}));
    EXPECT_EQ(start(2), (Start{0, Hours(3), 0}));
    EXPECT_EQ(start(3), (Start{0, Hours(3), Hours(2)}));
    EXPECT_EQ(start(5), (Start{0, Hours(3), 0}));
    EXPECT_EQ(start(6), (Start{0, Hours(3), 0}));
}

TEST(ZtShuttle, PlayBackwardThroughMidnightBeginsOnEitherSide)
{
    const auto start = [](int current) {
        return StartAt(ZtShuttle::Reverse, 22, current, 3);
    };

    EXPECT_EQ(start(21), (Start{1, Hours(5), 0}));
    EXPECT_EQ(start(22), (Start{1, Hours(5), Hours(5)}));
    EXPECT_EQ(start(23), (Start{1, Hours(5), Hours(4)}));
    EXPECT_EQ(start(0), (Start{1, Hours(5), Hours(3)}));
    EXPECT_EQ(start(2), (Start{1, Hours(5), Hours(1)}));
    EXPECT_EQ(start(3), (Start{1, Hours(5), 0}));
    EXPECT_EQ(start(4), (Start{1, Hours(5), 0}));
}

TEST(ZtShuttle, ARangeOfNoLengthIsNeitherLongNorThroughMidnight)
{
    for (const auto state : {ZtShuttle::Play, ZtShuttle::Reverse})
        EXPECT_EQ(StartAt(state, 4, 7, 4), (Start{0, 0, 0}));
}

TEST(ZtShuttle, SpeedZeroHasNoRange)
{
    EXPECT_EQ(StartAt(ZtShuttle::Play, 2, 3, 5, 0.0f), (Start{0, 0, 0}));
    EXPECT_EQ(StartAt(ZtShuttle::Reverse, 2, 3, 5, 0.0f), (Start{0, 0, 0}));
}

TEST(ZtShuttle, ANegativeBaseSpeedTurnsDirectionsRound)
{
    // Backward from the in point to the out point goes through midnight.
    EXPECT_EQ(StartAt(ZtShuttle::Play, 2, 2, 5, -1.0f),
              (Start{1, Hours(21), 0}));
    EXPECT_EQ(StartAt(ZtShuttle::Reverse, 2, 5, 5, -1.0f),
              (Start{1, Hours(21), 0}));
}

// The time that comes out.

TEST(ZtShuttle, PlaysFromTheCurrentTimeAtItsSpeed)
{
    RecordingShuttle shuttle;
    shuttle.Mark(0, 20, 100);
    shuttle.SetSpeed(0.5f, 0);

    shuttle.SetState(ZtShuttle::Play, 0);
    EXPECT_TRUE(IsNear(shuttle.After(10), KvoTime(0, 0, 25, 0)));
    shuttle.SetState(ZtShuttle::Reverse, 0);
    EXPECT_TRUE(IsNear(shuttle.After(10), KvoTime(0, 0, 20, 0)));
}

TEST(ZtShuttle, FastForwardAtBaseSpeedTwoPlaysAtTwoAndAHalf)
{
    RecordingShuttle shuttle;
    shuttle.Mark(0, 0, 100);
    shuttle.SetSpeed(2.0f, 0);

    shuttle.SetState(ZtShuttle::FastForward, 0);

    EXPECT_EQ(shuttle.speed, 2.5f);
    EXPECT_TRUE(IsNear(shuttle.After(10), KvoTime(0, 0, 25, 0)));
}

TEST(ZtShuttle, BeforeTheInPointPlayStartsFromTheInPoint)
{
    RecordingShuttle shuttle;
    shuttle.Mark(10, 5, 20);

    shuttle.SetState(ZtShuttle::Play, 0);

    EXPECT_EQ(shuttle.offset, KvoTime::ZERO);
    EXPECT_EQ(shuttle.Time(), KvoTime(0, 0, 10, 0));
    EXPECT_TRUE(IsNear(shuttle.After(1), KvoTime(0, 0, 11, 0)));
}

TEST(ZtShuttle, TwoMinutesThroughMidnight)
{
    RecordingShuttle shuttle;
    shuttle.SetTime(KvoTime(23, 59, 0, 0), ZtShuttle::in_point, 0);
    shuttle.SetTime(KvoTime(23, 59, 0, 0), ZtShuttle::current_time, 0);
    shuttle.SetTime(KvoTime(0, 1, 0, 0), ZtShuttle::out_point, 0);
    shuttle.SetState(ZtShuttle::Play, 0);

    EXPECT_EQ(shuttle.length, KvoTime(0, 2, 0, 0));
    EXPECT_TRUE(IsNear(shuttle.After(59.5), KvoTime(23, 59, 59, 15)));
    EXPECT_TRUE(IsNear(shuttle.After(1), KvoTime(0, 0, 0, 15)));
    EXPECT_TRUE(IsNear(shuttle.After(59), KvoTime(0, 0, 59, 15)));
    EXPECT_EQ(shuttle.After(1), KvoTime(0, 1, 0, 0));
    EXPECT_EQ(shuttle.state, ZtShuttle::Stopped);
}

TEST(ZtShuttle, TwoMinutesBackwardThroughMidnight)
{
    RecordingShuttle shuttle;
    shuttle.SetTime(KvoTime(23, 59, 0, 0), ZtShuttle::in_point, 0);
    shuttle.SetTime(KvoTime(0, 1, 0, 0), ZtShuttle::current_time, 0);
    shuttle.SetTime(KvoTime(0, 1, 0, 0), ZtShuttle::out_point, 0);
    shuttle.SetState(ZtShuttle::Reverse, 0);

    EXPECT_TRUE(IsNear(shuttle.After(59.5), KvoTime(0, 0, 0, 15)));
    EXPECT_TRUE(IsNear(shuttle.After(1), KvoTime(23, 59, 59, 15)));
    EXPECT_EQ(shuttle.After(60), KvoTime(23, 59, 0, 0));
    EXPECT_EQ(shuttle.state, ZtShuttle::Stopped);
}

TEST(ZtShuttle, ASwingThroughMidnightComesBack)
{
    RecordingShuttle shuttle;
    shuttle.SetTime(KvoTime(23, 59, 50, 0), ZtShuttle::in_point, 0);
    shuttle.SetTime(KvoTime(23, 59, 50, 0), ZtShuttle::current_time, 0);
    shuttle.SetTime(KvoTime(0, 0, 10, 0), ZtShuttle::out_point, 0);
    shuttle.SetRepeatMode(ZtShuttle::Swing, 0);
    shuttle.SetState(ZtShuttle::Play, 0);

    EXPECT_EQ(shuttle.After(21), KvoTime(0, 0, 10, 0));
    EXPECT_EQ(shuttle.state, ZtShuttle::Reverse);
    EXPECT_TRUE(IsNear(shuttle.After(15), KvoTime(23, 59, 55, 0)));
    EXPECT_EQ(shuttle.After(6), KvoTime(23, 59, 50, 0));
    EXPECT_EQ(shuttle.state, ZtShuttle::Play);
}

TEST(ZtShuttle, ARangeOfNoLengthStaysWhereItStarts)
{
    for (const auto mode :
         {ZtShuttle::Once, ZtShuttle::Loop, ZtShuttle::Swing}) {
        RecordingShuttle shuttle;
        shuttle.Mark(7, 3, 7);
        shuttle.SetRepeatMode(mode, 0);
        shuttle.SetState(ZtShuttle::Play, 0);

        EXPECT_EQ(shuttle.After(1000), KvoTime(0, 0, 7, 0));
        EXPECT_EQ(shuttle.state, ZtShuttle::Play);
        EXPECT_EQ(shuttle.playing, 1);
    }
}

TEST(ZtShuttle, ARangeOfNoLengthForgetsTheOneBefore)
{
    for (const auto state : {ZtShuttle::Play, ZtShuttle::Reverse}) {
        RecordingShuttle shuttle;
        shuttle.Mark(7, 7, 20);
        shuttle.SetState(state, 0);
        shuttle.SetState(ZtShuttle::Stopped, 0);
        shuttle.Mark(7, 7, 7);
        shuttle.SetState(state, 0);

        EXPECT_EQ(shuttle.length, KvoTime::ZERO);
        EXPECT_EQ(shuttle.After(1000), KvoTime(0, 0, 7, 0));
        EXPECT_EQ(shuttle.state, state);
    }
}

TEST(ZtShuttle, SpeedZeroHasARangeOfNoLength)
{
    RecordingShuttle shuttle;
    shuttle.Mark(10, 15, 20);
    shuttle.SetState(ZtShuttle::Play, 0);
    shuttle.SetSpeed(0.0f, 0);
    shuttle.SetState(ZtShuttle::Reverse, 0);

    EXPECT_EQ(shuttle.length, KvoTime::ZERO);
}

TEST(ZtShuttle, APointBeyondOneDayIsWrappedWhenPlayed)
{
    RecordingShuttle shuttle;
    shuttle.times[ZtShuttle::in_point] = KvoTime(25, 0, 0, 0);
    shuttle.times[ZtShuttle::out_point] = KvoTime(26, 0, 0, 0);
    shuttle.SetState(ZtShuttle::Play, 0);

    EXPECT_EQ(shuttle.After(0), KvoTime(1, 0, 0, 0));
    EXPECT_EQ(shuttle.After(3600), KvoTime(2, 0, 0, 0));
}

TEST(ZtShuttle, SpeedZeroJumpsToTheStartOfTheRangeAndStays)
{
    RecordingShuttle shuttle;
    shuttle.Mark(10, 15, 20);
    shuttle.SetSpeed(0.0f, 0);

    shuttle.SetState(ZtShuttle::Play, 0);
    EXPECT_EQ(shuttle.After(1000), KvoTime(0, 0, 10, 0));
    shuttle.SetState(ZtShuttle::Reverse, 0);
    EXPECT_EQ(shuttle.After(1000), KvoTime(0, 0, 20, 0));
    EXPECT_EQ(shuttle.playing, 1);
}

TEST(ZtShuttle, ForwardFromTheOutPointEndsAtOnce)
{
    RecordingShuttle shuttle;
    shuttle.Mark(10, 20, 20);
    shuttle.SetState(ZtShuttle::Play, 0);

    // The end itself still belongs to the range.
    EXPECT_EQ(shuttle.Time(), KvoTime(0, 0, 20, 0));
    EXPECT_EQ(shuttle.state, ZtShuttle::Play);
    EXPECT_EQ(shuttle.After(0.001), KvoTime(0, 0, 20, 0));
    EXPECT_EQ(shuttle.state, ZtShuttle::Stopped);
}

TEST(ZtShuttle, ReverseFromTheInPointStartsAtTheOutPoint)
{
    RecordingShuttle shuttle;
    shuttle.Mark(10, 10, 20);

    shuttle.SetState(ZtShuttle::Reverse, 0);

    EXPECT_EQ(shuttle.Time(), KvoTime(0, 0, 20, 0));
    EXPECT_TRUE(IsNear(shuttle.After(3), KvoTime(0, 0, 17, 0)));
}

TEST(ZtShuttle, ContinuousRunsOnPastTheOutPoint)
{
    RecordingShuttle shuttle;
    shuttle.Mark(10, 12, 20);
    shuttle.SetRepeatMode(ZtShuttle::Continuous, 0);
    shuttle.SetState(ZtShuttle::Play, 0);

    EXPECT_TRUE(IsNear(shuttle.After(5), KvoTime(0, 0, 17, 0)));
    EXPECT_TRUE(IsNear(shuttle.After(100), KvoTime(0, 1, 57, 0)));
    EXPECT_EQ(shuttle.state, ZtShuttle::Play);
    EXPECT_EQ(shuttle.playing, 1);
}

TEST(ZtShuttle, ContinuousRunsBackwardThroughMidnight)
{
    RecordingShuttle shuttle;
    shuttle.Mark(10, 20, 20);
    shuttle.SetRepeatMode(ZtShuttle::Continuous, 0);
    shuttle.SetState(ZtShuttle::FastReverse, 0);

    EXPECT_TRUE(IsNear(shuttle.After(12), KvoTime(0, 0, 5, 0)));
    EXPECT_TRUE(IsNear(shuttle.After(12), KvoTime(23, 59, 50, 0)));
    EXPECT_EQ(shuttle.state, ZtShuttle::FastReverse);
}

TEST(ZtShuttle, ContinuousRunsOnWhenThereIsNoRange)
{
    RecordingShuttle shuttle;
    shuttle.SetRepeatMode(ZtShuttle::Continuous, 0);
    shuttle.SetState(ZtShuttle::Play, 0);

    EXPECT_TRUE(IsNear(shuttle.After(90), KvoTime(0, 1, 30, 0)));
}

TEST(ZtShuttle, ContinuousFollowsAClockThatIsSet)
{
    RecordingShuttle shuttle;
    shuttle.SetRepeatMode(ZtShuttle::Continuous, 0);
    shuttle.SetState(ZtShuttle::Play, 0);

    EXPECT_TRUE(IsNear(shuttle.After(3600), KvoTime(1, 0, 0, 0)));
    EXPECT_TRUE(IsNear(shuttle.After(-7200), KvoTime(23, 0, 0, 0)));
    EXPECT_TRUE(IsNear(shuttle.After(7200), KvoTime(1, 0, 0, 0)));
    EXPECT_EQ(shuttle.state, ZtShuttle::Play);
}

TEST(ZtShuttle, ContinuousRunsOnForDays)
{
    struct Case
    {
        double seconds;
        int within; ///< What single precision costs by then, in ticks.
    };
    for (const Case& each :
         {Case{75.4 * 3600, 200}, Case{99.5 * 3600, 400},
          Case{24.9 * 86400, 3000}, Case{365.0 * 86400, 40000}}) {
        RecordingShuttle shuttle;
        shuttle.SetRepeatMode(ZtShuttle::Continuous, 0);
        shuttle.SetState(ZtShuttle::Play, 0);

        const KvoTime reached = shuttle.After(each.seconds);

        const auto wanted = KvoTime::FromTicks(
            static_cast<std::int32_t>(std::fmod(each.seconds * 6000, day)));
        // The shorter way round the day.
        const KvoTime off = (reached - wanted).Wrap();
        EXPECT_LE(std::min(off.Ticks(), day - off.Ticks()), each.within)
            << each.seconds;
        EXPECT_EQ(shuttle.state, ZtShuttle::Play);
    }
}

TEST(ZtShuttle, ALongAbsenceEndsTheRangeLikeAShortOne)
{
    for (const double seconds : {75.4 * 3600, 99.5 * 3600, 24.9 * 86400, 1e9}) {
        RecordingShuttle once;
        once.Mark(10, 15, 20);
        once.SetState(ZtShuttle::Play, 0);
        EXPECT_EQ(once.After(seconds), KvoTime(0, 0, 20, 0));

        RecordingShuttle loop;
        loop.Mark(10, 15, 20);
        loop.SetRepeatMode(ZtShuttle::Loop, 0);
        loop.SetState(ZtShuttle::Reverse, 0);
        EXPECT_EQ(loop.After(seconds), KvoTime(0, 0, 20, 0));
        EXPECT_TRUE(IsNear(loop.After(1), KvoTime(0, 0, 19, 0)));
    }
}

TEST(ZtShuttle, SpeedsThatAreNoNumbersDoNoHarm)
{
    const float infinity = std::numeric_limits<float>::infinity();
    const float not_a_number = std::numeric_limits<float>::quiet_NaN();
    for (const auto mode : {ZtShuttle::Once, ZtShuttle::Loop, ZtShuttle::Swing,
                            ZtShuttle::Continuous})
        for (const float speed : {infinity, -infinity, not_a_number, 1e38f}) {
            RecordingShuttle shuttle;
            shuttle.Mark(10, 15, 20);
            shuttle.SetRepeatMode(mode, 0);
            shuttle.SetSpeed(speed, 0);
            shuttle.SetState(ZtShuttle::Play, 0);

            for (int question = 0; question < 10; ++question) {
                const KvoTime time = shuttle.After(0.1);
                EXPECT_TRUE(time >= KvoTime::ZERO &&
                            time < KvoTime::FromTicks(day))
                    << mode << ' ' << speed << ' ' << time.Ticks();
            }
        }
}

// Rates.

TEST(ZtShuttle, TenSecondsAtSevenFramesASecond)
{
    const DefaultRate rate(7);
    RecordingShuttle shuttle;
    shuttle.Mark(0, 0, 60);
    shuttle.SetState(ZtShuttle::Play, 0);

    EXPECT_TRUE(IsNear(shuttle.After(10), KvoTime::FromTicks(59990)));
}

TEST(ZtShuttle, TheStartIsExactAtEveryRate)
{
    for (const int fps : {7, 24, 25, 29, 30, 60, 1000, 6000, 6001, -30, 0}) {
        const DefaultRate rate(fps);
        RecordingShuttle shuttle;
        shuttle.SetTime(KvoTime::FromTicks(123457), ZtShuttle::in_point, 0);
        shuttle.SetTime(KvoTime::FromTicks(765433), ZtShuttle::out_point, 0);

        shuttle.SetState(ZtShuttle::Play, 0);
        EXPECT_EQ(shuttle.Time(), KvoTime::FromTicks(123457)) << fps;
        shuttle.SetTime(KvoTime::ZERO, ZtShuttle::current_time, 0);
        shuttle.SetState(ZtShuttle::Reverse, 0);
        EXPECT_EQ(shuttle.Time(), KvoTime::FromTicks(765433)) << fps;
    }
}

TEST(ZtShuttle, WithNoRateAtAllTheTimeStaysAtTheStart)
{
    const DefaultRate rate(0);
    for (const auto mode : {ZtShuttle::Once, ZtShuttle::Continuous}) {
        RecordingShuttle shuttle;
        shuttle.Mark(10, 10, 20);
        shuttle.SetRepeatMode(mode, 0);
        shuttle.SetState(ZtShuttle::Play, 0);

        EXPECT_EQ(shuttle.After(100), KvoTime(0, 0, 10, 0));
        EXPECT_EQ(shuttle.state, ZtShuttle::Play);
    }
}

// Against the formulas.

namespace {
/// The formula of the position with no care for anything, for a fraction from
/// 0 to 1; every step in the precision it is described in.
KvoTime LiteralPosition(const ZtShuttle& shuttle, double reading)
{
    const KvoTime whole_day(24, 0, 0, 0);
    const KvoTime minute(0, 1, 0, 0);
    const bool continuous = shuttle.repeat_mode == ZtShuttle::Continuous;
    const auto frames = [](KvoTime time) {
        return static_cast<double>(time.Ticks()) * KvoTime::default_fps /
               6000.0;
    };
    const KvoTime position =
        KvoTime(KvoTime::seconds, reading) + shuttle.offset;
    const KvoTime whole = continuous ? minute : shuttle.length;
    float fraction = 0;
    if (frames(whole) != 0)
        fraction = static_cast<float>(frames(position) / frames(whole));
    KvoTime from = shuttle.from;
    KvoTime to = shuttle.to;
    if (continuous) {
        to = shuttle.speed > 0 ? from + minute : from - minute;
    } else if (shuttle.wraps && to < from) {
        while (from > to)
            from -= whole_day;
    } else if (shuttle.wraps) {
        while (to > from)
            to -= whole_day;
    }
    if (fraction == 0)
        return from.Wrap();
    return KvoTime(frames(from) +
                   static_cast<double>(fraction) * (frames(to) - frames(from)))
        .Wrap();
}

const ZtShuttle::StateType playing_states[] = {
    ZtShuttle::FastReverse, ZtShuttle::Reverse, ZtShuttle::Play,
    ZtShuttle::FastForward};
} // namespace

TEST(ZtShuttle, EveryPositionEqualsTheLiteralFormula)
{
    std::mt19937 random(1234);
    std::uniform_int_distribution<std::int32_t> any_time(0, day - 1);
    std::uniform_real_distribution<double> any_part(0.0, 0.999);
    int compared = 0;
    for (int round = 0; round < 20000; ++round) {
        const DefaultRate rate(round % 5 ? 30 : 7);
        RecordingShuttle shuttle;
        for (const int index : {0, 2, 4})
            shuttle.SetTime(KvoTime::FromTicks(any_time(random)), index, 0);
        shuttle.SetSpeed(static_cast<float>(any_part(random) + 0.1), 0);
        if (round % 3 == 0)
            shuttle.SetRepeatMode(ZtShuttle::Continuous, 0);
        shuttle.SetState(playing_states[round % 4], 0);
        const KvoTime left = shuttle.length - shuttle.offset;
        const double seconds =
            any_part(random) * left.Ticks() / 6000.0 / shuttle.stopwatch.rate;

        shuttle.clock.AdvanceMicroseconds(static_cast<long>(seconds * 1e6));
        const double reading = shuttle.stopwatch.Split();
        const KvoTime wanted = LiteralPosition(shuttle, reading);

        ASSERT_EQ(shuttle.Time(), wanted) << round;
        ++compared;
    }
    EXPECT_EQ(compared, 20000);
}

TEST(ZtShuttle, ShortRangesAreRightToAFewTicks)
{
    std::mt19937 random(4321);
    std::uniform_int_distribution<std::int32_t> any_time(0, day - 1);
    std::uniform_int_distribution<std::int32_t> any_length(1, 30 * 360000);
    std::uniform_real_distribution<double> any_part(0.0, 0.999);
    for (int round = 0; round < 20000; ++round) {
        RecordingShuttle shuttle;
        const auto in = KvoTime::FromTicks(any_time(random));
        const auto length = KvoTime::FromTicks(any_length(random));
        shuttle.SetTime(in, ZtShuttle::in_point, 0);
        shuttle.SetTime(in, ZtShuttle::current_time, 0);
        shuttle.SetTime(in + length, ZtShuttle::out_point, 0);
        shuttle.SetState(ZtShuttle::Play, 0);

        const double seconds = any_part(random) * length.Ticks() / 6000.0;
        const KvoTime reached = shuttle.After(seconds);

        const auto wanted =
            (in + KvoTime::FromTicks(static_cast<int>(seconds * 6000))).Wrap();
        const KvoTime off = (reached - wanted).Wrap();
        ASSERT_LE(std::min(off.Ticks(), day - off.Ticks()), 4) << round;
    }
}

// A range of many hours moves in steps: the float knows 2^24 places in it.
TEST(ZtShuttle, TheFractionOfALongRangeIsAFloat)
{
    RecordingShuttle shuttle;
    shuttle.SetTime(KvoTime(23, 0, 0, 0), ZtShuttle::out_point, 0);
    shuttle.SetState(ZtShuttle::Play, 0);
    const KvoTime before = shuttle.After(22 * 3600);

    int steps = 0;
    KvoTime last = before;
    for (int tick = 0; tick < 600; ++tick) {
        const KvoTime now = shuttle.After(1.0 / 6000);
        EXPECT_TRUE(now >= last);
        steps += now != last;
        last = now;
    }

    EXPECT_GT(steps, 5);
    EXPECT_LT(steps, 60) << "600 ticks of play, in steps of 29 and more";
}

// Random use against a model that knows the states, not the positions.
TEST(ZtShuttle, RandomUseKeepsStateAndNotificationsInStep)
{
    std::mt19937 random(77);
    std::uniform_int_distribution<int> any(0, 1000000);
    RecordingShuttle shuttle;
    shuttle.Mark(10, 10, 20);
    for (int step = 0; step < 20000; ++step) {
        switch (any(random) % 5) {
        case 0:
            shuttle.SetState(static_cast<ZtShuttle::StateType>(any(random) % 5),
                             1);
            break;
        case 1:
            shuttle.SetRepeatMode(
                static_cast<ZtShuttle::RepeatType>(any(random) % 3), 1);
            break;
        case 2:
            shuttle.SetTime(KvoTime(any(random) % 1000), any(random) % 5, 1);
            break;
        default:
            shuttle.After(any(random) % 3000 / 1000.0);
            break;
        }
        ASSERT_EQ(shuttle.playing, shuttle.state != ZtShuttle::Stopped);
        ASSERT_EQ(shuttle.go_pending, 0);
        ASSERT_TRUE(shuttle.times[2] >= KvoTime::ZERO &&
                    shuttle.times[2] < KvoTime::FromTicks(day));
        const auto count = [&](const char* line) {
            return std::count(shuttle.log.begin(), shuttle.log.end(), line);
        };
        if (step % 1000 == 0) {
            ASSERT_EQ(count("play") - count("post"), shuttle.playing);
        }
    }
}
