#include "support/BeatTest.h"

// The clock at the figures where narrower arithmetic gives way.
namespace {

using Moments = std::vector<std::int64_t>;

constexpr std::int64_t second = 1000;
constexpr std::int64_t hour = 3600 * second;
constexpr std::int64_t day = 24 * hour;

class BeatUptime : public BeatTest
{
protected:
    /// Starts the beat a minute before midnight.
    BeatUptime()
    {
        ZtTimerBeat::start();
        ZtTimerBeat::global_start_tm = KvoTime(23, 59, 0, 0);
        ZtTimerBeat::global_tm = ZtTimerBeat::global_start_tm;
    }

    /// Lets this many milliseconds pass since the start, and beats once.
    void BeatAt(std::int64_t milliseconds)
    {
        clock.AdvanceMicroseconds((milliseconds - Milliseconds()) * 1000);
        Beats(1);
    }
};

std::int32_t WrappedTicks(double ticks)
{
    return static_cast<std::int32_t>(
        static_cast<std::uint32_t>(static_cast<std::int64_t>(ticks)));
}

TEST_F(BeatUptime, TheClockGoesOnOverMidnight)
{
    BeatAt(61 * second);

    EXPECT_EQ(ZtTimerBeat::global_tm, KvoTime(24, 0, 1, 0));
}

TEST_F(BeatUptime, MillisecondsAreNarrowedToSinglePrecision)
{
    // 2^24 + 1, after 4.66 hours.
    BeatAt(16777217);

    EXPECT_EQ(ZtTimerBeat::global_tm - ZtTimerBeat::global_start_tm,
              KvoTime::FromTicks(16777216 * 6));
}

TEST_F(BeatUptime, TheClockWrapsWhereTicksLeaveTheirRange)
{
    for (const std::int64_t moment :
         {75 * hour, 76 * hour, 99 * hour, 100 * hour, 200 * hour}) {
        BeatAt(moment);

        const double ticks =
            static_cast<double>(static_cast<float>(moment)) * 6.0;
        EXPECT_EQ(ZtTimerBeat::global_tm,
                  KvoTime(23, 59, 0, 0) +
                      KvoTime::FromTicks(WrappedTicks(ticks)))
            << moment;
    }
}

TEST_F(BeatUptime, ATimerRunsOnOverTheWrap)
{
    ZtTimer timer(KvoTime::ZERO, KvoTime(1, 0, 0, 0));
    timer.post_trigger(Note, Named("t"), KvoTime(0, 30, 0, 0));
    // 23:59 and 75.4 hours are 2^31 ticks.
    BeatAt(75 * hour);
    timer.start();
    Beats(1);
    const int before = ZtTimerBeat::global_tm.Ticks();
    ASSERT_GT(before, 0);

    BeatAt(75 * hour + hour / 2 + second);

    EXPECT_LT(ZtTimerBeat::global_tm.Ticks(), 0);
    EXPECT_EQ(BeatLog::Texts(), "t");
    EXPECT_NEAR(timer.current.Ticks(), KvoTime(0, 30, 1, 0).Ticks(), 200);
    BeatAt(75 * hour + hour + second);
    EXPECT_EQ(timer.state, ZtTimer::Stopped);
    EXPECT_EQ(timer.current, KvoTime(1, 0, 0, 0));
}

TEST_F(BeatUptime, RepeatsKeepTheirMultiplesAfterAMonth)
{
    ZtTimer timer;
    timer.post_repeat(Note, Named("r"), 100);
    timer.start();
    Beats(1);
    // 2^31 milliseconds are 24.9 days.
    for (const std::int64_t days : {24, 25, 50, 100}) {
        BeatAt(days * day + 8);
        BeatLog::Clear();

        alarm.Run(300000);

        EXPECT_EQ(
            BeatLog::Moments("r"),
            (Moments{days * day + 100, days * day + 200, days * day + 300}));
    }
}

TEST_F(BeatUptime, TheWallClockOfABeatIsRightAfterAMonth)
{
    BeatAt(40 * day + 1);

    EXPECT_EQ(ZtTimerBeat::current_timeval.tv_sec -
                  ZtTimerBeat::start_timeval.tv_sec,
              40 * 86400);
    EXPECT_EQ(ZtTimerBeat::current_timeval.tv_usec, 1000);
}

TEST_F(BeatUptime, ABeatThatTookAMonthIsFollowedAtOnce)
{
    static FakeClock* its_clock;
    its_clock = &clock;
    ZtTimer timer;
    timer.post_trigger(
        [](ZtTimer*, void*) {
            its_clock->AdvanceMicroseconds(30 * day * 1000);
        },
        nullptr, KvoTime::ZERO);
    timer.start();

    Beats(2);

    EXPECT_EQ(alarm.Wait(), 1);
}

} // namespace
