#include "ZT/swatch.h"

#include <cmath>
#include <limits>

#include <gtest/gtest.h>

#include "support/FakeClock.h"

// Stands first: the counter belongs to the process.
TEST(ZtMicroWatch, ItsCounterIsNullUntilTheFirstWatchIsMade)
{
    EXPECT_TRUE(ZtMicroWatch::iotimer == nullptr);
    EXPECT_TRUE(nullptr == ZtMicroWatch::iotimer);
    EXPECT_FALSE(ZtMicroWatch::iotimer != nullptr);
    EXPECT_FALSE(nullptr != ZtMicroWatch::iotimer);
    EXPECT_TRUE(!ZtMicroWatch::iotimer);
    EXPECT_EQ(ZtMicroWatch::microRes, 0u);
    EXPECT_EQ(*ZtMicroWatch::iotimer, 0u);

    ZtMicroWatch watch;

    EXPECT_FALSE(ZtMicroWatch::iotimer == nullptr);
    EXPECT_TRUE(ZtMicroWatch::iotimer != nullptr);
    EXPECT_TRUE(nullptr != ZtMicroWatch::iotimer);
    EXPECT_TRUE(static_cast<bool>(ZtMicroWatch::iotimer));
    EXPECT_EQ(ZtMicroWatch::microRes, 1000u);
}

TEST(ZtMicroWatch, StartsAtTheCounterAndMeasuresMicroseconds)
{
    FakeClock clock;
    ZtMicroWatch watch;

    clock.AdvanceMicroseconds(250);

    const std::uint32_t ticks = *ZtMicroWatch::iotimer - watch.start;
    EXPECT_EQ(ticks / ZtMicroWatch::microRes, 250u);
}

TEST(ZtMicroWatch, MeasuresAcrossTheWrapOfTheCounter)
{
    FakeClock clock;
    clock.AdvanceMicroseconds(3294967); // 1 s + 3294967 us: 300 ns below 2^32
    ZtMicroWatch watch;

    clock.AdvanceMicroseconds(10);

    EXPECT_GT(watch.start, *ZtMicroWatch::iotimer);
    const std::uint32_t ticks = *ZtMicroWatch::iotimer - watch.start;
    EXPECT_EQ(ticks, 10000u);
}

TEST(ZtMicroWatch, DoesNotNoticeThatTheWallClockIsSet)
{
    FakeClock clock;
    ZtMicroWatch watch;

    clock.SetWall(0, 0);

    EXPECT_EQ(*ZtMicroWatch::iotimer, watch.start);
}

TEST(ZtMicroWatch, InitCycleTimerCanBeCalledAgain)
{
    FakeClock clock;
    ZtMicroWatch watch;

    ZtMicroWatch::InitCycleTimer();

    EXPECT_EQ(ZtMicroWatch::microRes, 1000u);
    EXPECT_EQ(*ZtMicroWatch::iotimer, watch.start);
}

TEST(ZtMicroWatch, AnswersAsAPlainObject)
{
    ZtMicroWatch watch;

    EXPECT_STREQ(watch.ClassName(), "KvoObject");
}

TEST(ZtStopWatch, StartsAtTheClockOnTheWall)
{
    FakeClock clock;
    clock.SetWall(1234, 567890);

    ZtStopWatch watch(2.0);

    EXPECT_EQ(watch.start.tv_sec, 1234);
    EXPECT_EQ(watch.start.tv_usec, 567890);
    EXPECT_EQ(watch.rate, 2.0);
    EXPECT_EQ(watch.Split(), 0.0);
}

TEST(ZtStopWatch, ReadsSecondsToTheMicrosecond)
{
    FakeClock clock;
    ZtStopWatch watch(1.0);

    clock.AdvanceMicroseconds(1500001);

    EXPECT_DOUBLE_EQ(watch.Split(), 1.500001);
}

TEST(ZtStopWatch, MultipliesByItsRate)
{
    FakeClock clock;
    ZtStopWatch watch(2.0);

    clock.AdvanceMicroseconds(1000000);

    EXPECT_EQ(watch.Split(), 2.0);
    watch.rate = -0.5;
    EXPECT_EQ(watch.Split(), -0.5);
    watch.rate = 0.0;
    EXPECT_EQ(watch.Split(), 0.0);
}

TEST(ZtStopWatch, SplitLeavesTheMarkWhereItIs)
{
    FakeClock clock;
    ZtStopWatch watch(1.0);

    clock.AdvanceMicroseconds(1000000);
    watch.Split();
    clock.AdvanceMicroseconds(1000000);

    EXPECT_EQ(watch.Split(), 2.0);
}

TEST(ZtStopWatch, MarkReadsFromTheMarkBeforeAndMarksAnew)
{
    FakeClock clock;
    ZtStopWatch watch(2.0);

    clock.AdvanceMicroseconds(1000000);
    const double first = watch.Mark();
    const double at_once = watch.Split();
    clock.AdvanceMicroseconds(250000);

    EXPECT_EQ(first, 2.0);
    EXPECT_EQ(at_once, 0.0);
    EXPECT_EQ(watch.Mark(), 0.5);
}

TEST(ZtStopWatch, BorrowsFromTheSeconds)
{
    FakeClock clock;
    clock.SetWall(100, 900000);
    ZtStopWatch watch(1.0);

    clock.SetWall(102, 100000);

    EXPECT_DOUBLE_EQ(watch.Split(), 1.2);
}

TEST(ZtStopWatch, ReadsBelowZeroWhenTheWallClockIsSetBack)
{
    FakeClock clock;
    ZtStopWatch watch(1.0);

    clock.AdvanceMicroseconds(-3600000000);

    EXPECT_EQ(watch.Mark(), -3600.0);
    EXPECT_EQ(watch.Split(), 0.0);
}

TEST(ZtStopWatch, MeasuresForMonths)
{
    FakeClock clock;
    ZtStopWatch watch(1.0);

    clock.AdvanceMicroseconds(100L * 24 * 3600 * 1000000);

    EXPECT_EQ(watch.Split(), 8640000.0);
}

TEST(ZtStopWatch, RunsByTheSystemsClockOtherwise)
{
    ZtStopWatch watch(1.0);
    const timeval now = zt_platform::Clock::current().wall();

    while (watch.Split() == 0.0) { // until the next microsecond
    }

    EXPECT_LE(now.tv_sec - watch.start.tv_sec, 1);
}

TEST(ZtStopWatch, AnswersAsAPlainObject)
{
    ZtStopWatch watch(1.0);

    EXPECT_STREQ(watch.ClassName(), "KvoObject");
    EXPECT_EQ(watch.IsModified(), 0);
}
