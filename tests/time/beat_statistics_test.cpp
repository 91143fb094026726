#include "time/beat_statistics.h"

#include "support/BeatTest.h"

namespace {

using Statistics = ZtTimerBeatStatistics;

TEST(BeatStatistics, SmallLatenessHasABucketAMicrosecond)
{
    for (int late = 0; late <= 16; ++late)
        EXPECT_EQ(Statistics::BucketStart(late), late);
}

TEST(BeatStatistics, BucketsGrowByAnEighthAtMost)
{
    for (int bucket = 17; bucket < Statistics::bucket_count; ++bucket) {
        const std::int64_t here = Statistics::BucketStart(bucket);
        const std::int64_t before = Statistics::BucketStart(bucket - 1);
        EXPECT_GT(here, before);
        EXPECT_LE(here - before, (before + 7) / 8);
    }
}

TEST(BeatStatistics, ABucketThatDoesNotExistStartsAtZero)
{
    EXPECT_EQ(Statistics::BucketStart(-1), 0);
    EXPECT_EQ(Statistics::BucketStart(Statistics::bucket_count), 0);
}

TEST(BeatStatistics, EveryLatenessFallsIntoTheBucketThatHoldsIt)
{
    for (std::int64_t late = 0; late < 3000000000; late += late / 7 + 1) {
        Statistics statistics = {};

        zt_time::note_beat(statistics, late);

        int bucket = 0;
        while (statistics.lateness[bucket] == 0)
            ++bucket;
        EXPECT_LE(Statistics::BucketStart(bucket), late);
        ASSERT_LT(bucket + 1, Statistics::bucket_count);
        EXPECT_GT(Statistics::BucketStart(bucket + 1), late);
    }
}

TEST(BeatStatistics, TheLongestFallsIntoTheLastBucket)
{
    Statistics statistics = {};

    zt_time::note_beat(statistics, INT64_MAX);

    EXPECT_EQ(statistics.lateness[Statistics::bucket_count - 1], 1);
    EXPECT_EQ(statistics.Quantile(0.5), INT64_MAX);
}

TEST(BeatStatistics, ABeatBeforeItsTimeIsPunctual)
{
    Statistics statistics = {};

    zt_time::note_beat(statistics, -500);

    EXPECT_EQ(statistics.lateness[0], 1);
    EXPECT_EQ(statistics.latest, 0);
}

TEST(BeatStatistics, QuantilesAreExactWhereBucketsAre)
{
    Statistics statistics = {};
    for (int late = 1; late <= 10; ++late)
        zt_time::note_beat(statistics, late);

    EXPECT_EQ(statistics.Quantile(0), 1);
    EXPECT_EQ(statistics.Quantile(0.5), 5);
    EXPECT_EQ(statistics.Quantile(0.9), 9);
    EXPECT_EQ(statistics.Quantile(1), 10);
}

TEST(BeatStatistics, AQuantileIsNotOverTheLatest)
{
    Statistics statistics = {};
    zt_time::note_beat(statistics, 1000);

    EXPECT_EQ(statistics.Quantile(0.5), 1000);
    EXPECT_EQ(statistics.latest, 1000);
}

TEST(BeatStatistics, WithoutBeatsEveryQuantileIsZero)
{
    const Statistics statistics = {};

    EXPECT_EQ(statistics.Quantile(0.5), 0);
    EXPECT_EQ(statistics.Quantile(1), 0);
}

class BeatMeasure : public BeatTest
{};

TEST_F(BeatMeasure, LatenessIsFromTheMomentTheAlarmWasSetFor)
{
    ZtTimerBeat::start();
    Beats(2);

    clock.AdvanceMicroseconds(4011);
    Beats(1);

    const Statistics& statistics = ZtTimerBeat::Statistics();
    EXPECT_EQ(statistics.beats, 3);
    EXPECT_EQ(statistics.lateness[0], 2);
    EXPECT_EQ(statistics.lateness[11], 1);
    EXPECT_EQ(statistics.latest, 11);
}

TEST_F(BeatMeasure, LoadBeginsAnew)
{
    ZtTimerBeat::start();
    Beats(5);

    ZtTimerBeat::start();

    EXPECT_EQ(ZtTimerBeat::Statistics().beats, 0);
    EXPECT_EQ(ZtTimerBeat::Statistics().overruns, 0);
}

} // namespace
