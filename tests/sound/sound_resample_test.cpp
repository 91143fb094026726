#include <KVO/KvoSound.h>

#include <cmath>

#include <gtest/gtest.h>

#include "platform/sample_lanes.h"
#include "sound/literal.h"
#include "sound/sounds.h"
#include "support/ErrorTrap.h"

namespace {

using zt_platform::SampleLanes;

TEST(sound_resample, EightFramesAtTwiceTheRateLieHalfWayBetween)
{
    KvoSound sound = MonoSound({10, 20, 30, 40, 50, 60, 70, 80});
    KvoSound filtered = sound;
    filtered.LoPass(8000);
    const Samples low = SamplesOf(filtered);

    sound.Resample(16000);

    EXPECT_EQ(sound.rate, 16000);
    ASSERT_EQ(sound.frames, 16);
    const Samples result = SamplesOf(sound);
    for (std::size_t i = 0; i < 8; ++i) {
        EXPECT_EQ(result[2 * i], low[i]);
        const int next = i < 7 ? low[i + 1] : low[i];
        EXPECT_EQ(result[2 * i + 1], low[i] + (next - low[i]) / 2);
    }
}

TEST(KvoSound, ResampleOfStereoRepeatsFrames)
{
    KvoSound sound = StereoSound({{100, 1}, {200, 2}, {300, 3}});
    KvoSound filtered = sound;
    filtered.LoPass(8000);
    const Samples low = SamplesOf(filtered);

    sound.Resample(16000);

    EXPECT_EQ(SamplesOf(sound),
              (Samples{low[0], low[1], low[0], low[1], low[2], low[3], low[2],
                       low[3], low[4], low[5], low[4], low[5]}));
}

TEST(sound_resample, TheSameRateStillLimitsTheBand)
{
    KvoSound sound = MonoSound({10, 20, 30});
    KvoSound filtered = sound;
    filtered.LoPass(4000);

    sound.Resample(8000);

    EXPECT_EQ(SamplesOf(sound), SamplesOf(filtered));
    EXPECT_NE(SamplesOf(sound), (Samples{10, 20, 30}));
}

TEST(sound_resample, HalfTheNewRateIsRoundedTowardZero)
{
    KvoSound sound = MonoSound({10000, 20000, 30000}, 8);
    KvoSound filtered = sound;
    filtered.LoPass(3);

    sound.Resample(7);

    EXPECT_EQ(sound.frames, 2);
    EXPECT_EQ(sound.samples[0], filtered.samples[0]);
}

TEST(sound_resample, RandomSoundsAreConvertedLikeLiteralOnesByEveryLane)
{
    static const long rates[] = {1,     2,     7,     999,   8000,  11025,
                                 16000, 22050, 44100, 48000, 96000, 95999};
    for (std::size_t number = 0; SampleLanes::numbered(number); ++number) {
        SampleLanes::install(SampleLanes::numbered(number));
        std::mt19937 random(81);
        for (long rate : rates)
            for (long new_rate : rates)
                for (int channels : {1, 2}) {
                    const auto step = static_cast<std::size_t>(channels);
                    const std::size_t longest = new_rate / rate > 100 ? 4 : 400;
                    const Samples samples =
                        RandomSamples(random, step * (1 + random() % longest));
                    KvoSound sound = SoundOf(samples, channels, rate);

                    sound.Resample(new_rate);

                    ASSERT_EQ(SamplesOf(sound),
                              literal::Resample(samples, step, rate, new_rate))
                        << rate << " to " << new_rate;
                    ASSERT_EQ(sound.rate, new_rate);
                }
    }
    SampleLanes::install(nullptr);
}

TEST(sound_resample, LongSoundsAreConvertedLikeLiteralOnesByEveryLane)
{
    for (std::size_t number = 0; SampleLanes::numbered(number); ++number) {
        SampleLanes::install(SampleLanes::numbered(number));
        std::mt19937 random(82);
        for (auto [rate, new_rate] :
             {std::pair(44100L, 48000L), std::pair(48000L, 44100L),
              std::pair(8000L, 44100L), std::pair(44100L, 8000L),
              std::pair(96000L, 11L), std::pair(44100L, 22050L)})
            for (int channels : {1, 2}) {
                const auto step = static_cast<std::size_t>(channels);
                const Samples samples = RandomSamples(random, step * 30011);
                KvoSound sound = SoundOf(samples, channels, rate);

                sound.Resample(new_rate);

                ASSERT_EQ(SamplesOf(sound),
                          literal::Resample(samples, step, rate, new_rate))
                    << rate << " to " << new_rate;
            }
    }
    SampleLanes::install(nullptr);
}

TEST(sound_resample, RatesOutsideTheRangeDoNothing)
{
    for (long rate : {0L, -1L, 2147483648L, -9223372036854775807L - 1}) {
        KvoSound sound = MonoSound({1, 2, 3});
        KvoSound odd = MonoSound({1, 2, 3}, rate);

        sound.Resample(rate);
        odd.Resample(8000);

        EXPECT_EQ(SamplesOf(sound), (Samples{1, 2, 3}));
        EXPECT_EQ(sound.rate, 8000);
        EXPECT_EQ(SamplesOf(odd), (Samples{1, 2, 3}));
        EXPECT_EQ(odd.rate, rate);
    }
}

TEST(sound_resample, MoreFramesThanThereCanBeDoNothing)
{
    KvoSound sound = MonoSound({1, 2, 3}, 1);

    sound.Resample(2147483647);

    EXPECT_EQ(SamplesOf(sound), (Samples{1, 2, 3}));
    EXPECT_EQ(sound.rate, 1);
}

TEST(sound_resample, TheHighestRatesDoNotOverflow)
{
    KvoSound sound = MonoSound({1, 2, 3}, 2147483647);

    sound.Resample(2147483646);

    EXPECT_EQ(sound.frames, 2);
    EXPECT_EQ(sound.rate, 2147483646);
}

TEST(sound_resample, TooFewFramesForOneEmptyTheSound)
{
    KvoSound sound = MonoSound({1, 2, 3}, 8000);

    sound.Resample(1000);

    EXPECT_EQ(sound.frames, 0);
    EXPECT_EQ(sound.samples, nullptr);
    EXPECT_EQ(sound.rate, 1000);
}

TEST(sound_resample, ASpeedOfTwoHalvesTheFramesAndKeepsTheRate)
{
    for (int channels : {1, 2}) {
        KvoSound sound = SoundOf(Samples(400, 500), channels);
        KvoSound converted = sound;
        converted.Resample(4000);

        sound.Speed(2.0f);

        EXPECT_EQ(sound.frames, 200 / channels);
        EXPECT_EQ(sound.rate, 8000);
        EXPECT_EQ(SamplesOf(sound), SamplesOf(converted));
    }
}

TEST(sound_resample, SlowerIsLonger)
{
    KvoSound sound = MonoSound(Samples(100, 500));

    sound.Speed(0.5f);

    EXPECT_EQ(sound.frames, 200);
    EXPECT_EQ(sound.rate, 8000);
}

TEST(sound_resample, TheRateOfASpeedIsTruncated)
{
    KvoSound sound = MonoSound(Samples(100, 500), 10);
    KvoSound converted = sound;
    converted.Resample(3);

    sound.Speed(3.0f);

    EXPECT_EQ(sound.frames, 30);
    EXPECT_EQ(SamplesOf(sound), SamplesOf(converted));
}

TEST(sound_resample, SpeedsThatAreNoneDoNothing)
{
    for (float speed : {0.0f, -0.0f, -1.0f, std::nanf(""), 1e30f, -1e30f,
                        1e-30f, std::numeric_limits<float>::infinity()}) {
        KvoSound sound = MonoSound({1, 2, 3});
        const ErrorTrap reports;

        sound.Speed(speed);

        EXPECT_EQ(SamplesOf(sound), (Samples{1, 2, 3})) << speed;
        EXPECT_EQ(sound.rate, 8000);
        EXPECT_EQ(reports.Text(), "");
    }
}

} // namespace
