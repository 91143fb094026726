// Time values as numbers: construction, timecode, units, wrapping, arithmetic.
// Text and binary forms are in KvoTime_text_test.cpp.

#include <KVO/KvoTime.h>

#include <cfenv>
#include <climits>
#include <cmath>
#include <limits>
#include <random>
#include <type_traits>
#include <vector>

#include <gtest/gtest.h>

#include "support/DefaultRate.h"
#include "support/LiteralTimecode.h"
#include "support/PrintTime.h"

namespace {
constexpr float infinity = std::numeric_limits<float>::infinity();
constexpr float not_a_number = std::numeric_limits<float>::quiet_NaN();

/// The parts of a time at a rate; the returned hours are checked on the way.
LiteralTimecode PartsOf(long ticks, int fps)
{
    int hh = 0;
    int mm = 0;
    int ss = 0;
    int ff = 0;
    const long hours =
        KvoTime::get_timecode_parts(ticks, &hh, &mm, &ss, &ff, fps);
    EXPECT_EQ(static_cast<int>(hours), hh);
    return {hours, mm, ss, ff};
}

std::int32_t TicksOf(int hh, int mm, int ss, int ff, int fps = 0)
{
    return KvoTime(hh, mm, ss, ff, fps).Ticks();
}
} // namespace

// The value itself.

TEST(KvoTime, IsAPlainValueOfFourBytes)
{
    EXPECT_EQ(sizeof(KvoTime), 4u);
    EXPECT_TRUE(std::is_trivially_copyable_v<KvoTime>);
    EXPECT_TRUE(std::is_standard_layout_v<KvoTime>);
    EXPECT_FALSE(std::is_polymorphic_v<KvoTime>);
    EXPECT_TRUE((std::is_same_v<decltype(KvoTime::tick_count), std::int32_t>));
}

TEST(KvoTime, StartsAtZeroTicks)
{
    EXPECT_EQ(KvoTime().Ticks(), 0);
    EXPECT_EQ(KvoTime().tick_count, 0);
}

TEST(KvoTime, UnitsAreNumberedInOrder)
{
    EXPECT_EQ(static_cast<int>(KvoTime::ticks), 0);
    EXPECT_EQ(static_cast<int>(KvoTime::milliseconds), 1);
    EXPECT_EQ(static_cast<int>(KvoTime::seconds), 2);
    EXPECT_EQ(static_cast<int>(KvoTime::minutes), 3);
    EXPECT_EQ(static_cast<int>(KvoTime::hours), 4);
}

TEST(KvoTime, ClassWideDataHasItsInitialValues)
{
    EXPECT_EQ(KvoTime::default_fps, 30);
    EXPECT_EQ(KvoTime::binaryIO, 0);
    EXPECT_EQ(KvoTime::ZERO.Ticks(), 0);
    EXPECT_EQ(KvoTime::FOREVER.Ticks(), 1036800000);
    EXPECT_EQ(KvoTime::FOREVER, KvoTime(48, 0, 0, 0));
}

// Construction.

TEST(KvoTime, FourFieldsAreAddedUp)
{
    EXPECT_EQ(TicksOf(0, 0, 1, 0), 6000);
    EXPECT_EQ(TicksOf(0, 0, 0, 1, 25), 240);
    EXPECT_EQ(TicksOf(1, 0, 0, 0), 21600000);
    EXPECT_EQ(TicksOf(0, 1, 0, 0), 360000);
    EXPECT_EQ(TicksOf(1, 2, 3, 4), 21600000 + 720000 + 18000 + 800);
}

TEST(KvoTime, FieldsHaveNoRange)
{
    EXPECT_EQ(TicksOf(0, 0, 90, 0), 540000);
    EXPECT_EQ(TicksOf(0, 0, 0, 100), 20000);
    EXPECT_EQ(TicksOf(0, 100, 0, 0), 36000000);
    EXPECT_EQ(TicksOf(-1, 0, 1, 0), -21594000);
}

TEST(KvoTime, FieldsThatDoNotFitWrapAround)
{
    EXPECT_EQ(TicksOf(INT_MAX, 0, 0, 0), -21600000);
    EXPECT_EQ(TicksOf(INT_MIN, 0, 0, 0), 0);
    EXPECT_EQ(TicksOf(99, 60, 0, 0), 100 * 21600000LL - (1LL << 32));
}

TEST(KvoTime, AFrameIsAWholeNumberOfTicksAtTheCommonRates)
{
    EXPECT_EQ(KvoTime(1, 24).Ticks(), 250);
    EXPECT_EQ(KvoTime(1, 25).Ticks(), 240);
    EXPECT_EQ(KvoTime(1, 30).Ticks(), 200);
    EXPECT_EQ(KvoTime(1, 60).Ticks(), 100);
}

TEST(KvoTime, AFrameIsATruncatedNumberOfTicks)
{
    EXPECT_EQ(KvoTime(1, 7).Ticks(), 857);
    EXPECT_EQ(KvoTime(7, 7).Ticks(), 5999);
    EXPECT_EQ(PartsOf(6000 - 1, 7), (LiteralTimecode{0, 0, 0, 6 + 1}));
    EXPECT_EQ(PartsOf(6 * 857 - 1, 7), (LiteralTimecode{0, 0, 0, 5}));
}

TEST(KvoTime, ARateOfZeroIsTheDefaultAtTheMomentOfTheCall)
{
    const DefaultRate rate(24);

    EXPECT_EQ(KvoTime(1).Ticks(), 250);
    EXPECT_EQ(KvoTime(1, 0).Ticks(), 250);
    EXPECT_EQ(KvoTime(1L).Ticks(), 250);
    EXPECT_EQ(KvoTime(1.5).Ticks(), 375);
    EXPECT_EQ(KvoTime(1.5f).Ticks(), 375);
    EXPECT_EQ(KvoTime(0, 0, 0, 1).Ticks(), 250);
    EXPECT_EQ(KvoTime("0:0:0:1").Ticks(), 250);
    KvoTime::default_fps = 60;
    EXPECT_EQ(KvoTime(1).Ticks(), 100);
    EXPECT_EQ(KvoTime(1, 24).Ticks(), 250);
}

TEST(KvoTime, RatesThatLeaveNoFrameMakeEveryNumberOfFramesZero)
{
    EXPECT_EQ(KvoTime(1000, 6000).Ticks(), 1000);
    EXPECT_EQ(KvoTime(1000, 6001).Ticks(), 0);
    EXPECT_EQ(KvoTime(1000, INT_MAX).Ticks(), 0);
    EXPECT_EQ(KvoTime(1000, INT_MIN).Ticks(), 0);
    EXPECT_EQ(KvoTime(1000.5, 6001).Ticks(), 0);
    EXPECT_EQ(KvoTime(1000.5f, 6001).Ticks(), 0);
    EXPECT_EQ(TicksOf(0, 0, 1, 1000, 6001), 6000);
    const DefaultRate none(0);
    EXPECT_EQ(KvoTime(1000).Ticks(), 0);
    EXPECT_EQ(KvoTime(1000.5).Ticks(), 0);
    EXPECT_EQ(TicksOf(0, 0, 1, 1000), 6000);
}

TEST(KvoTime, ARateBelowZeroMakesFramesBelowZero)
{
    EXPECT_EQ(KvoTime(1, -1).Ticks(), -6000);
    EXPECT_EQ(KvoTime(2, -30).Ticks(), -400);
    EXPECT_EQ(PartsOf(7000, -30), (LiteralTimecode{0, 0, 1, -5}));
}

TEST(KvoTime, WholeNumbersOfEveryTypeAreFrames)
{
    EXPECT_EQ(KvoTime(5).Ticks(), 1000);
    EXPECT_EQ(KvoTime(5, 25).Ticks(), 1200);
    EXPECT_EQ(KvoTime(5L).Ticks(), 1000);
    EXPECT_EQ(KvoTime(5LL, 25).Ticks(), 1200);
    EXPECT_EQ(KvoTime(5u).Ticks(), 1000);
    EXPECT_EQ(KvoTime(static_cast<short>(-5)).Ticks(), -1000);
    EXPECT_EQ(KvoTime(static_cast<unsigned char>(5)).Ticks(), 1000);
    EXPECT_EQ(KvoTime(true).Ticks(), 200);
    EXPECT_EQ(KvoTime(0x100000005L).Ticks(), 1000);
}

TEST(KvoTime, ANumberOfFramesThatDoesNotFitWrapsAround)
{
    EXPECT_EQ(KvoTime(INT_MAX, 30).Ticks(), -200);
    EXPECT_EQ(KvoTime(INT_MIN, 6000).Ticks(), INT_MIN);
}

TEST(KvoTime, FractionsOfFramesTruncateTowardZero)
{
    EXPECT_EQ(KvoTime(2.5).Ticks(), 500);
    EXPECT_EQ(KvoTime(0.9999).Ticks(), 199);
    EXPECT_EQ(KvoTime(-0.9999).Ticks(), -199);
    EXPECT_EQ(KvoTime(0.004).Ticks(), 0);
    EXPECT_EQ(KvoTime(2.5, 24).Ticks(), 625);
    EXPECT_EQ(KvoTime(0.9999f).Ticks(), 199);
    EXPECT_EQ(KvoTime(-0.9999f).Ticks(), -199);
    EXPECT_EQ(KvoTime(2.5f, 24).Ticks(), 625);
}

TEST(KvoTime, DoublesAndFloatsKeepTheirPrecision)
{
    // 1000000.005 frames are 200000001 ticks; a float has no such number.
    EXPECT_EQ(KvoTime(1000000.005001).Ticks(), 200000001);
    EXPECT_EQ(KvoTime(1000000.005001f).Ticks(), 200000000);
    // The product 16777217.1875 rounds to the even number beside it.
    EXPECT_EQ(KvoTime(83886.0859375).Ticks(), 16777217);
    EXPECT_EQ(KvoTime(83886.0859375f).Ticks(), 16777218);
}

TEST(KvoTime, NumbersThatNoTickCountHoldsSaturate)
{
    EXPECT_EQ(KvoTime(1e30).Ticks(), INT_MAX);
    EXPECT_EQ(KvoTime(-1e30).Ticks(), INT_MIN);
    EXPECT_EQ(KvoTime(1e30f).Ticks(), INT_MAX);
    EXPECT_EQ(KvoTime(-infinity).Ticks(), INT_MIN);
    EXPECT_EQ(KvoTime(not_a_number).Ticks(), 0);
    EXPECT_EQ(KvoTime(static_cast<double>(not_a_number)).Ticks(), 0);
    EXPECT_EQ(KvoTime(infinity, 6001).Ticks(), 0);
    for (const auto unit :
         {KvoTime::ticks, KvoTime::milliseconds, KvoTime::seconds,
          KvoTime::minutes, KvoTime::hours}) {
        EXPECT_EQ(KvoTime(unit, 1e30f).Ticks(), INT_MAX);
        EXPECT_EQ(KvoTime(unit, -1e30f).Ticks(), INT_MIN);
        EXPECT_EQ(KvoTime(unit, not_a_number).Ticks(), 0);
        EXPECT_EQ(KvoTime(unit, infinity).Ticks(), INT_MAX);
    }
    EXPECT_EQ(KvoTime(2147483647.0, 6000).Ticks(), INT_MAX);
    EXPECT_EQ(KvoTime(2147483646.9, 6000).Ticks(), INT_MAX - 1);
    EXPECT_EQ(KvoTime(-2147483648.5, 6000).Ticks(), INT_MIN);
}

TEST(KvoTime, AmountsOfEachUnit)
{
    EXPECT_EQ(KvoTime(KvoTime::ticks, 7.9f).Ticks(), 7);
    EXPECT_EQ(KvoTime(KvoTime::milliseconds, 1.0f).Ticks(), 6);
    EXPECT_EQ(KvoTime(KvoTime::seconds, 1.0f).Ticks(), 6000);
    EXPECT_EQ(KvoTime(KvoTime::minutes, 1.0f).Ticks(), 360000);
    EXPECT_EQ(KvoTime(KvoTime::hours, 1.0f).Ticks(), 21600000);
    EXPECT_EQ(KvoTime(KvoTime::seconds, -0.00025f).Ticks(), -1);
    EXPECT_EQ(KvoTime(KvoTime::hours, -0.5f).Ticks(), -10800000);
}

TEST(KvoTime, AUnitThatDoesNotExistGivesZero)
{
    EXPECT_EQ(KvoTime(static_cast<KvoTime::Unit>(5), 1.0f).Ticks(), 0);
    EXPECT_EQ(KvoTime(static_cast<KvoTime::Unit>(-1), 1.0f).Ticks(), 0);
}

TEST(KvoTime, AmountsOfOtherTypesAreNoFrames)
{
    EXPECT_EQ(KvoTime(KvoTime::seconds, 1).Ticks(), 6000);
    EXPECT_EQ(KvoTime(KvoTime::seconds, 1L).Ticks(), 6000);
    EXPECT_EQ(KvoTime(KvoTime::seconds, 1u).Ticks(), 6000);
    EXPECT_EQ(KvoTime(KvoTime::seconds, 0).Ticks(), 0);
    EXPECT_EQ(KvoTime(KvoTime::seconds, 2.5).Ticks(), 15000);
    // Narrowed to single precision before anything else.
    EXPECT_EQ(KvoTime(KvoTime::ticks, 16777217.0).Ticks(), 16777216);
    EXPECT_EQ(KvoTime(KvoTime::ticks, 16777217).Ticks(), 16777216);
}

TEST(KvoTime, FromTicksTakesAndGivesTicks)
{
    EXPECT_EQ(KvoTime::FromTicks(-7).Ticks(), -7);
    EXPECT_EQ(KvoTime::FromTicks(INT_MIN).tick_count, INT_MIN);
}

// Timecode.

TEST(KvoTime, TimecodePartsOfATickCount)
{
    EXPECT_EQ(PartsOf(7000, 30), (LiteralTimecode{0, 0, 1, 5}));
    EXPECT_EQ(PartsOf(0, 30), (LiteralTimecode{0, 0, 0, 0}));
    EXPECT_EQ(PartsOf(7199, 30), (LiteralTimecode{0, 0, 1, 5}));
    EXPECT_EQ(PartsOf(21600000 + 720000 + 18000 + 960, 25),
              (LiteralTimecode{1, 2, 3, 4}));
}

TEST(KvoTime, PartsOfANegativeTimeAreNegative)
{
    EXPECT_EQ(PartsOf(-6000, 30), (LiteralTimecode{0, 0, -1, 0}));
    EXPECT_EQ(PartsOf(-1, 30), (LiteralTimecode{0, 0, 0, 0}));
    EXPECT_EQ(PartsOf(-21600000 - 200, 30), (LiteralTimecode{-1, 0, 0, -1}));
    EXPECT_EQ(PartsOf(INT_MIN, 30), LiteralSplit(INT_MIN, 30));
}

TEST(KvoTime, HoursAreNotReducedToADay)
{
    EXPECT_EQ(PartsOf(KvoTime::FOREVER.Ticks(), 30),
              (LiteralTimecode{48, 0, 0, 0}));
    EXPECT_EQ(PartsOf(21600000L * 1000 + 6000, 30),
              (LiteralTimecode{1000, 0, 1, 0}));
}

TEST(KvoTime, PartsOfTickCountsBeyondATimeAreExact)
{
    EXPECT_EQ(PartsOf(INT_MAX + 1L, 30), LiteralSplit(INT_MAX + 1L, 30));
    EXPECT_EQ(PartsOf(INT_MIN - 1L, 30), LiteralSplit(INT_MIN - 1L, 30));
    EXPECT_EQ(PartsOf(LONG_MAX, 24), LiteralSplit(LONG_MAX, 24));
    EXPECT_EQ(PartsOf(LONG_MIN, 24), LiteralSplit(LONG_MIN, 24));
}

TEST(KvoTime, PartsTakeTheRateAsGiven)
{
    EXPECT_EQ(PartsOf(7000, 0), (LiteralTimecode{0, 0, 1, 0}));
    EXPECT_EQ(PartsOf(7000, 6001), (LiteralTimecode{0, 0, 1, 0}));
    EXPECT_EQ(PartsOf(7000, -6001), (LiteralTimecode{0, 0, 1, 0}));
    EXPECT_EQ(PartsOf(7000, INT_MIN), (LiteralTimecode{0, 0, 1, 0}));
    EXPECT_EQ(PartsOf(7000, 7), (LiteralTimecode{0, 0, 1, 1}));
    EXPECT_EQ(PartsOf(7000, -1), (LiteralTimecode{0, 0, 1, 0}));
}

TEST(KvoTime, SplitEqualsTheLiteralFormulaEverywhere)
{
    std::mt19937 random(20240501);
    std::uniform_int_distribution<std::int32_t> any(INT_MIN, INT_MAX);
    std::uniform_int_distribution<int> rate(1, 6000);
    const std::vector<int> common = {24, 25, 30, 60, 7, 1, 6000, 2999, -25};

    for (int round = 0; round < 200000; ++round) {
        const std::int32_t ticks = any(random);
        const int fps =
            round % 2
                ? common[static_cast<std::size_t>(round / 2) % common.size()]
                : rate(random);
        ASSERT_EQ(PartsOf(ticks, fps), LiteralSplit(ticks, fps))
            << ticks << " at " << fps;
    }
}

TEST(KvoTime, SplitEqualsTheLiteralFormulaAroundEveryBoundary)
{
    for (const long step : {200L, 6000L, 360000L, 21600000L, 518400000L})
        for (const long times : {-4L, -1L, 0L, 1L, 2L, 4L})
            for (long off = -2; off <= 2; ++off) {
                const long ticks = step * times + off;
                ASSERT_EQ(PartsOf(ticks, 30), LiteralSplit(ticks, 30)) << ticks;
            }
}

TEST(KvoTime, SplitEqualsTheLiteralFormulaForEveryRemainderAtEveryRateInUse)
{
    for (int fps = 1; fps <= 130; ++fps)
        for (long ticks = -5999; ticks <= 5999; ++ticks)
            ASSERT_EQ(PartsOf(ticks, fps), LiteralSplit(ticks, fps))
                << ticks << " at " << fps;
}

TEST(KvoTime, TimecodeResolvesTheRate)
{
    const DefaultRate rate(25);
    int hh = 9;
    int mm = 9;
    int ss = 9;
    int ff = 9;

    const long hours =
        KvoTime::FromTicks(21600000 + 7000).Timecode(&hh, &mm, &ss, &ff);

    EXPECT_EQ(hours, 1);
    EXPECT_EQ(hh, 1);
    EXPECT_EQ(mm, 0);
    EXPECT_EQ(ss, 1);
    EXPECT_EQ(ff, 4);
    KvoTime::FromTicks(7000).Timecode(&hh, &mm, &ss, &ff, 60);
    EXPECT_EQ(ff, 10);
    KvoTime::default_fps = 0;
    KvoTime::FromTicks(7000).Timecode(&hh, &mm, &ss, &ff);
    EXPECT_EQ(ff, 0);
}

TEST(KvoTime, SetTimecodeReplacesTheValueAsTheConstructorBuildsIt)
{
    KvoTime time(99);

    time.SetTimecode(1, 2, 3, 4);
    EXPECT_EQ(time, KvoTime(1, 2, 3, 4));
    time.SetTimecode(0, 0, 90, -1, 25);
    EXPECT_EQ(time.Ticks(), 540000 - 240);
    time.SetTimecode(INT_MAX, INT_MAX, INT_MAX, INT_MAX, 1);
    EXPECT_EQ(time, KvoTime(INT_MAX, INT_MAX, INT_MAX, INT_MAX, 1));
}

TEST(KvoTime, TimecodeAndSetTimecodeGoRoundAtEveryCommonRate)
{
    std::mt19937 random(7);
    std::uniform_int_distribution<std::int32_t> any(INT_MIN, INT_MAX);
    for (int round = 0; round < 20000; ++round)
        for (const int fps : {24, 25, 30, 60}) {
            const std::int32_t frame = 6000 / fps;
            const auto start = KvoTime::FromTicks(any(random) / frame * frame);
            int hh = 0;
            int mm = 0;
            int ss = 0;
            int ff = 0;
            start.Timecode(&hh, &mm, &ss, &ff, fps);
            KvoTime back;
            back.SetTimecode(hh, mm, ss, ff, fps);
            ASSERT_EQ(back, start) << fps;
        }
}

// Units.

TEST(KvoTime, TimeInEachUnit)
{
    const auto time = KvoTime(1, 30, 0, 0);

    EXPECT_EQ(time.Time(KvoTime::ticks), 32400000.0f);
    EXPECT_EQ(time.Time(KvoTime::milliseconds), 5400000.0f);
    EXPECT_EQ(time.Time(KvoTime::seconds), 5400.0f);
    EXPECT_EQ(time.Time(KvoTime::minutes), 90.0f);
    EXPECT_EQ(time.Time(KvoTime::hours), 1.5f);
    EXPECT_EQ(KvoTime(-15).Time(KvoTime::seconds), -0.5f);
}

TEST(KvoTime, ForeverIsFortyEightHours)
{
    EXPECT_EQ(KvoTime::FOREVER.Time(KvoTime::hours), 48.0f);
    EXPECT_EQ(KvoTime::FOREVER.Wrap(), KvoTime::ZERO);
}

TEST(KvoTime, TimeInAUnitThatDoesNotExistIsZero)
{
    EXPECT_EQ(KvoTime(1).Time(static_cast<KvoTime::Unit>(5)), 0.0f);
    EXPECT_EQ(KvoTime(1).Time(static_cast<KvoTime::Unit>(-1)), 0.0f);
}

TEST(KvoTime, TimeIsDividedInSinglePrecision)
{
    const auto time = KvoTime::FromTicks(1000000007);

    EXPECT_EQ(time.Time(KvoTime::ticks), 1000000000.0f);
    EXPECT_EQ(time.Time(KvoTime::milliseconds), 1000000000.0f / 6.0f);
    EXPECT_EQ(time.Time(KvoTime::hours), 1000000000.0f / 21600000.0f);
}

TEST(KvoTime, LargeTickCountsAreRoundedBeforeTheyAreDivided)
{
    const auto time = [](std::int32_t ticks, KvoTime::Unit unit) {
        return KvoTime::FromTicks(ticks).Time(unit);
    };

    // Divided first and rounded then, each would be a bit larger or smaller.
    EXPECT_EQ(time(16777221, KvoTime::milliseconds), 2796203.25f);
    EXPECT_EQ(time(16777217, KvoTime::seconds), 2796.20264f);
    EXPECT_EQ(time(16777217, KvoTime::minutes), 46.6033783f);
    EXPECT_EQ(time(16777217, KvoTime::hours), 0.776722968f);
}

TEST(KvoTime, SetTimeReplacesTheValue)
{
    KvoTime time;

    time.SetTime(KvoTime::ticks, -7.9f);
    EXPECT_EQ(time.Ticks(), -7);
    time.SetTime(KvoTime::milliseconds, 2.5f);
    EXPECT_EQ(time.Ticks(), 15);
    time.SetTime(KvoTime::seconds, 1.5f);
    EXPECT_EQ(time.Ticks(), 9000);
    time.SetTime(KvoTime::minutes, 2);
    EXPECT_EQ(time.Ticks(), 720000);
    time.SetTime(KvoTime::hours, 0.25f);
    EXPECT_EQ(time.Ticks(), 5400000);
    time.SetTime(KvoTime::hours, 1e30f);
    EXPECT_EQ(time.Ticks(), INT_MAX);
    time.SetTime(KvoTime::hours, not_a_number);
    EXPECT_EQ(time.Ticks(), 0);
}

TEST(KvoTime, SetTimeWithAUnitThatDoesNotExistChangesNothing)
{
    auto time = KvoTime::FromTicks(77);

    time.SetTime(static_cast<KvoTime::Unit>(5), 1.0f);
    time.SetTime(static_cast<KvoTime::Unit>(-1), 1.0f);

    EXPECT_EQ(time.Ticks(), 77);
}

TEST(KvoTime, MillisecondsAreDoubleInTheConstructorAndSingleInSetTime)
{
    // Six times this needs 25 bits: 16777218.75 against 16777219.
    const float amount = 2796203.25f;
    KvoTime set;

    set.SetTime(KvoTime::milliseconds, amount);

    EXPECT_EQ(KvoTime(KvoTime::milliseconds, amount).Ticks(), 16777219);
    EXPECT_EQ(set.Ticks(), 16777220);
}

TEST(KvoTime, LongerUnitsRoundAtEachStep)
{
    int differs = 0;
    std::mt19937 random(3);
    std::uniform_real_distribution<float> any(0.0f, 20.0f);
    for (int round = 0; round < 20000; ++round) {
        const float amount = any(random);
        const volatile float in_seconds = amount * 6000.0f;
        const volatile float in_minutes = in_seconds * 60.0f;
        const volatile float in_hours = in_minutes * 60.0f;
        KvoTime set;
        set.SetTime(KvoTime::hours, amount);
        ASSERT_EQ(KvoTime(KvoTime::seconds, amount).Ticks(),
                  static_cast<int>(in_seconds));
        ASSERT_EQ(KvoTime(KvoTime::minutes, amount).Ticks(),
                  static_cast<int>(in_minutes));
        ASSERT_EQ(KvoTime(KvoTime::hours, amount).Ticks(),
                  static_cast<int>(in_hours));
        ASSERT_EQ(set.Ticks(), static_cast<int>(in_hours));
        differs += static_cast<int>(amount * 21600000.0f) != set.Ticks();
    }
    EXPECT_GT(differs, 0) << "one rounding would have done: nothing was shown";
}

TEST(KvoTime, ConversionsLeaveTheRoundingModeAloneAndTruncateUnderEveryMode)
{
    for (const int mode :
         {FE_TONEAREST, FE_UPWARD, FE_DOWNWARD, FE_TOWARDZERO}) {
        std::fesetround(mode);
        // Exact products, so that only the truncation could show the mode.
        const volatile float amount = 7.75f;
        const KvoTime up(KvoTime::ticks, amount);
        const KvoTime down(KvoTime::ticks, -amount);
        const KvoTime frames(static_cast<double>(amount), 6000);
        const int after = std::fegetround();
        std::fesetround(FE_TONEAREST);

        EXPECT_EQ(after, mode);
        EXPECT_EQ(up.Ticks(), 7);
        EXPECT_EQ(down.Ticks(), -7);
        EXPECT_EQ(frames.Ticks(), 7);
    }
}

// Wrapping.

TEST(KvoTime, WrapBringsIntoOneDay)
{
    constexpr std::int32_t day = 518400000;
    const std::vector<std::pair<std::int32_t, std::int32_t>> cases = {
        {0, 0},
        {1, 1},
        {-1, day - 1},
        {day - 1, day - 1},
        {day, 0},
        {day + 1, 1},
        {-day, 0},
        {-day - 1, day - 1},
        {2 * day, 0},
        {INT_MAX, INT_MAX - 4 * day},
        {INT_MIN, static_cast<std::int32_t>(INT_MIN + 5LL * day)},
    };
    for (const auto& [ticks, wrapped] : cases)
        EXPECT_EQ(KvoTime::FromTicks(ticks).Wrap().Ticks(), wrapped) << ticks;
}

TEST(KvoTime, WrapLeavesTheTimeItself)
{
    const KvoTime time(25, 0, 0, 0);

    EXPECT_EQ(time.Wrap(), KvoTime(1, 0, 0, 0));
    EXPECT_EQ(time.Ticks(), 25 * 21600000);
}

TEST(KvoTime, OneTickBeforeZeroIsTheLastFrameOfTheDay)
{
    EXPECT_EQ(PartsOf(KvoTime::FromTicks(-1).Wrap().Ticks(), 30),
              (LiteralTimecode{23, 59, 59, 29}));
}

TEST(KvoTime, WrapIsTheRemainderOfADay)
{
    constexpr long long day = 518400000;
    std::mt19937 random(99);
    std::uniform_int_distribution<std::int32_t> any(INT_MIN, INT_MAX);
    for (int round = 0; round < 100000; ++round) {
        const std::int32_t ticks = any(random);
        ASSERT_EQ(KvoTime::FromTicks(ticks).Wrap().Ticks(),
                  (ticks % day + day) % day);
    }
}

// Arithmetic.

TEST(KvoTime, SumsAndDifferences)
{
    KvoTime time(0, 0, 2, 0);

    EXPECT_EQ((time + KvoTime(0, 0, 1, 0)).Ticks(), 18000);
    EXPECT_EQ((time - KvoTime(0, 0, 3, 0)).Ticks(), -6000);
    EXPECT_EQ((-time).Ticks(), -12000);
    time += KvoTime::FromTicks(5);
    EXPECT_EQ(time.Ticks(), 12005);
    time -= KvoTime::FromTicks(12006);
    EXPECT_EQ(time.Ticks(), -1);
}

TEST(KvoTime, PlainNumbersJoinInAsFrames)
{
    KvoTime time(0, 0, 1, 0);

    EXPECT_EQ((time + 5).Ticks(), 7000);
    EXPECT_EQ((5 + time).Ticks(), 7000);
    EXPECT_EQ((time - 5L).Ticks(), 5000);
    EXPECT_EQ((time + 0.5).Ticks(), 6100);
    EXPECT_EQ((time += 1).Ticks(), 6200);
    EXPECT_TRUE(time == 31);
    EXPECT_TRUE(30 < time);
    EXPECT_TRUE(time > 0);
}

TEST(KvoTime, FactorsAndDivisors)
{
    EXPECT_EQ((KvoTime::FromTicks(7) * 3).Ticks(), 21);
    EXPECT_EQ((KvoTime::FromTicks(7) * -3).Ticks(), -21);
    EXPECT_EQ((KvoTime::FromTicks(7) / 2).Ticks(), 3);
    EXPECT_EQ((KvoTime::FromTicks(-7) / 2).Ticks(), -3);
    EXPECT_EQ((KvoTime::FromTicks(7) / -1).Ticks(), -7);
}

TEST(KvoTime, ADivisorOfZeroGivesZero)
{
    EXPECT_EQ((KvoTime::FromTicks(7) / 0).Ticks(), 0);
    EXPECT_EQ((KvoTime::FromTicks(INT_MIN) / 0).Ticks(), 0);
}

TEST(KvoTime, ArithmeticWrapsAround)
{
    const auto least = KvoTime::FromTicks(INT_MIN);
    const auto most = KvoTime::FromTicks(INT_MAX);

    EXPECT_EQ((most + KvoTime::FromTicks(1)), least);
    EXPECT_EQ((least - KvoTime::FromTicks(1)), most);
    EXPECT_EQ(-least, least);
    EXPECT_EQ(least * -1, least);
    EXPECT_EQ(least / -1, least);
    EXPECT_EQ((most * 2).Ticks(), -2);
    EXPECT_EQ((KvoTime::FOREVER + KvoTime::FOREVER).Ticks(), 2073600000);
    EXPECT_EQ((KvoTime::FOREVER * 3).Ticks(), 3110400000LL - (1LL << 32));
}

TEST(KvoTime, ComparesByTicks)
{
    const auto a = KvoTime::FromTicks(-1);
    const auto b = KvoTime::FromTicks(1);

    EXPECT_TRUE(a < b && a <= b && a != b && b > a && b >= a);
    EXPECT_FALSE(a == b || a > b || a >= b || b < a || b <= a);
    EXPECT_TRUE(a == a && a <= a && a >= a);
    EXPECT_TRUE(KvoTime::FromTicks(INT_MIN) < KvoTime::FromTicks(INT_MAX));
}

TEST(KvoTime, ArithmeticEqualsSixtyFourBitsNarrowed)
{
    std::mt19937 random(11);
    std::uniform_int_distribution<std::int32_t> any(INT_MIN, INT_MAX);
    const auto narrow = [](long long value) {
        return static_cast<std::int32_t>(static_cast<std::uint32_t>(value));
    };
    for (int round = 0; round < 100000; ++round) {
        const std::int32_t a = any(random);
        const std::int32_t b = any(random);
        const auto x = KvoTime::FromTicks(a);
        const auto y = KvoTime::FromTicks(b);
        ASSERT_EQ((x + y).Ticks(), narrow(0LL + a + b));
        ASSERT_EQ((x - y).Ticks(), narrow(0LL + a - b));
        ASSERT_EQ((x * b).Ticks(), narrow(1LL * a * b));
        if (b != 0) {
            ASSERT_EQ((x / b).Ticks(), narrow(1LL * a / b));
        }
        ASSERT_EQ(x < y, a < b);
    }
}
