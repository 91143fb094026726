#include <KVO/KvoSound.h>

#include <cmath>
#include <numbers>

#include <gtest/gtest.h>

#include "platform/sample_lanes.h"
#include "sound/literal.h"
#include "sound/sounds.h"
#include "support/ErrorTrap.h"

namespace {

using zt_platform::SampleLanes;

/// Runs a check with the plain lanes and with all faster ones.
template <class Check>
void WithAllLanes(const Check& check)
{
    for (std::size_t number = 0; SampleLanes::numbered(number); ++number) {
        SampleLanes::install(SampleLanes::numbered(number));
        check();
    }
    SampleLanes::install(nullptr);
}

// --- low pass ----------------------------------------------------------------

TEST(KvoSound, LoPassAmplifiesAndWraps)
{
    KvoSound sound = MonoSound({1000, 1000, 1000, 1000});

    sound.LoPass(8000);

    EXPECT_EQ(SamplesOf(sound), (Samples{1000, 7282, 7282, 7282}));

    KvoSound loud = MonoSound({20000, 20000});
    loud.LoPass(8000);
    EXPECT_EQ(SamplesOf(loud), (Samples{20000, static_cast<short>(145647)}));
}

TEST(sound_filters, LoPassWeighsASampleAndTheOneBeforeIt)
{
    // A frequency of 0 leaves nothing of the sample and all of the one before.
    KvoSound mono = MonoSound({1, 2, 3, 4});
    KvoSound stereo = StereoSound({{1, 10}, {2, 20}, {3, 30}});

    mono.LoPass(0);
    stereo.LoPass(0);

    EXPECT_EQ(SamplesOf(mono), (Samples{1, 1, 2, 3}));
    EXPECT_EQ(SamplesOf(stereo), (Samples{1, 10, 1, 10, 2, 20}));
}

TEST(sound_filters, LoPassDividesByTheRateTwice)
{
    // At 4 hertz, w is pi / 2 and g is exp(-pi / 8), not exp(-pi / 2).
    KvoSound sound = MonoSound({0, 10000, 0}, 4);

    sound.LoPass(1);

    EXPECT_EQ(
        SamplesOf(sound),
        (Samples{0, 15707,
                 static_cast<short>(10000 * std::exp(-std::numbers::pi / 8))}));
}

TEST(sound_filters, LoPassTruncatesEachProduct)
{
    // Both products are 0.6 or so; their sum would be 1.
    KvoSound sound = MonoSound({1, 1}, 10);

    sound.LoPass(1);

    EXPECT_EQ(SamplesOf(sound), (Samples{1, 0}));
}

TEST(sound_filters, LoPassIsTheLiteralOneForEveryLane)
{
    WithAllLanes([] {
        std::mt19937 random(71);
        for (int i = 0; i < 600; ++i) {
            const int channels = 1 + i % 2;
            const auto step = static_cast<std::size_t>(channels);
            const long rate = 1 + static_cast<long>(random() % 48000);
            const long frequency = static_cast<long>(random() % 50000) - 1000;
            Samples samples = RandomSamples(random, step * (random() % 150));
            KvoSound sound = SoundOf(samples, channels, rate);

            sound.LoPass(frequency);

            literal::LoPass(samples, step, frequency, rate);
            ASSERT_EQ(SamplesOf(sound), samples) << frequency << " " << rate;
        }
    });
}

TEST(sound_filters, LoPassOfHugeFrequenciesAndOddRatesIsDefined)
{
    for (auto [frequency, rate] :
         {std::pair(2000000000L, 1L), std::pair(-2000000000L, 1L),
          std::pair(9223372036854775807L, 8000L), std::pair(100L, 0L),
          std::pair(0L, 0L), std::pair(-100L, 0L), std::pair(100L, -8000L)}) {
        Samples samples = {1,  -2, 3,  -32768, 32767, 0,  5,  7,  9,
                           10, 11, 12, 13,     14,    15, 16, 17, 18};
        KvoSound sound = SoundOf(samples, 1, rate);

        sound.LoPass(frequency);

        literal::LoPass(samples, 1, frequency, rate);
        EXPECT_EQ(SamplesOf(sound), samples) << frequency << " " << rate;
    }
}

// --- pre-emphasis ------------------------------------------------------------

TEST(sound_filters, PreEmphasisTakesAShareOfTheSampleBefore)
{
    KvoSound mono = MonoSound({10, 20, 30, 41});
    KvoSound stereo =
        StereoSound({{10, 1}, {20, 3}, {30, 5}, {41, -7}, {50, 9}});

    mono.PreEmphasis(0.5f);
    stereo.PreEmphasis(0.5f);

    EXPECT_EQ(SamplesOf(mono), (Samples{10, 20, 20, 26}));
    EXPECT_EQ(SamplesOf(stereo),
              (Samples{10, 1, 20, 3, 20, 4, 26, -9, 30, 12}));
}

TEST(sound_filters, PreEmphasisIsTheLiteralOneForEveryLane)
{
    WithAllLanes([] {
        std::mt19937 random(72);
        for (int i = 0; i < 600; ++i) {
            const int channels = 1 + i % 2;
            const auto step = static_cast<std::size_t>(channels);
            static const float shares[] = {0.95f, -0.4f,    0,        1,
                                           -1,    32768.0f, 40000.0f, -1e30f};
            const float share = shares[random() % 8];
            Samples samples = RandomSamples(random, step * (random() % 150));
            KvoSound sound = SoundOf(samples, channels);

            sound.PreEmphasis(share);

            literal::PreEmphasis(samples, step, share);
            ASSERT_EQ(SamplesOf(sound), samples) << share;
        }
    });
}

TEST(sound_filters, PreEmphasisOfNotANumberChangesNothing)
{
    KvoSound sound = MonoSound({1, 2, 3, 4});

    sound.PreEmphasis(std::nanf(""));

    EXPECT_EQ(SamplesOf(sound), (Samples{1, 2, 3, 4}));
}

// --- high pass and band pass
// ---------------------------------------------------

TEST(sound_filters, HiPassFollowsItsFormula)
{
    const Samples in = {1000, 3000, -2000, -2000, 500};
    KvoSound sound = MonoSound(in, 4);

    sound.HiPass(1);

    const float g = literal::LowPassDecay(1, 4);
    Samples expected = {1000};
    float y = 1000;
    for (std::size_t i = 1; i < in.size(); ++i) {
        y = g * (y - static_cast<float>(in[i - 1]) + static_cast<float>(in[i]));
        expected.push_back(static_cast<short>(y));
    }
    EXPECT_EQ(SamplesOf(sound), expected);
    EXPECT_NE(expected[4], in[4]);
}

TEST(sound_filters, HiPassKeepsItsStateInSinglePrecisionNotInSamples)
{
    // g is 0.675: of 1 remain 0.675, 0.456, ..., all cut to 0; the step of 2
    // then finds 0.3 left over, which a state of whole samples would not have.
    KvoSound sound = MonoSound({1, 1, 1, 3}, 4);

    sound.HiPass(1);

    const float g = literal::LowPassDecay(1, 4);
    EXPECT_EQ(SamplesOf(sound),
              (Samples{1, 0, 0, static_cast<short>(g * (g * g + 2))}));
}

TEST(sound_filters, HiPassRunsOverEachChannelByItself)
{
    const Samples left = {100, 50, 25, -3000};
    const Samples right = {-7, 9, 2000, 12};
    KvoSound both =
        StereoSound({{100, -7}, {50, 9}, {25, 2000}, {-3000, 12}}, 100);
    KvoSound one = MonoSound(left, 100);
    KvoSound other = MonoSound(right, 100);

    both.HiPass(20);
    one.HiPass(20);
    other.HiPass(20);

    KvoSound taken_left = both;
    taken_left.Mono(1);
    KvoSound taken_right = both;
    taken_right.Mono(2);
    EXPECT_EQ(SamplesOf(taken_left), SamplesOf(one));
    EXPECT_EQ(SamplesOf(taken_right), SamplesOf(other));
}

TEST(sound_filters, HiPassOfAConstantDiesAway)
{
    KvoSound sound = MonoSound(Samples(400, 10000), 8);

    sound.HiPass(4);

    const Samples result = SamplesOf(sound);
    EXPECT_EQ(result[0], 10000);
    EXPECT_GT(result[1], 0);
    EXPECT_EQ(result[399], 0);
}

TEST(sound_filters, BandPassFollowsItsFormula)
{
    const Samples in = {10000, 0, 0, -5000, 200};
    KvoSound sound = MonoSound(in, 8000);

    sound.BandPass(1000, 200);

    const double e = std::exp(-2 * std::numbers::pi * 200 / 8000);
    const double c = std::cos(2 * std::numbers::pi * 1000 / 8000);
    const double b = -4 * e / (e + 1) * c;
    const double gain = (1 - e) * std::sqrt(1 - b * b / (4 * e));
    double y1 = 0;
    double y2 = 0;
    const Samples out = SamplesOf(sound);
    for (std::size_t i = 0; i < in.size(); ++i) {
        const double y = gain * in[i] - b * y1 - e * y2;
        EXPECT_NEAR(out[i], y, 1.0);
        y2 = y1;
        y1 = y;
    }
}

TEST(sound_filters, BandPassKeepsWhatIsAroundItsCentre)
{
    auto level_of = [](double frequency) {
        Samples wave;
        for (int i = 0; i < 8000; ++i)
            wave.push_back(static_cast<short>(
                10000 * std::sin(2 * std::numbers::pi * frequency * i / 8000)));
        KvoSound sound = MonoSound(wave);
        sound.BandPass(1000, 100);
        return sound.Volume();
    };

    EXPECT_GT(level_of(1000), 5 * level_of(300));
    EXPECT_GT(level_of(1000), 5 * level_of(3000));
    EXPECT_NEAR(level_of(1000), 10000 / 32768.0 / std::sqrt(2), 0.03);
}

TEST(sound_filters, BandPassRunsOverEachChannelByItself)
{
    KvoSound both = StereoSound({{9000, 0}, {0, 0}, {0, -9000}, {5, 6}});
    KvoSound left = both;
    KvoSound right = both;
    left.Mono(1);
    right.Mono(2);

    both.BandPass(500, 300);
    left.BandPass(500, 300);
    right.BandPass(500, 300);

    KvoSound taken = both;
    taken.Mono(1);
    EXPECT_EQ(SamplesOf(taken), SamplesOf(left));
    both.Mono(2);
    EXPECT_EQ(SamplesOf(both), SamplesOf(right));
}

TEST(sound_filters, OddBandsAndRatesAreDefined)
{
    for (long rate : {8000L, 1L, 0L, -5L})
        for (long low : {0L, 100L, -100L, 9223372036854775807L})
            for (long high : {0L, 100L, 2000000000L, -2000000000L}) {
                KvoSound band = MonoSound({1, -32768, 32767, 4, 5}, rate);
                KvoSound above = band;

                band.BandPass(low, high);
                above.HiPass(high);

                EXPECT_EQ(band.frames, 5);
                EXPECT_EQ(above.frames, 5);
            }
}

// --- windows -----------------------------------------------------------------

/// Multiplies a whole sound of 8000 hertz by a window.
void MultiplyWhole(KvoSound& sound, KvoSound::WindowType type)
{
    const KvoTime length =
        KvoTime::FromTicks(static_cast<int>(sound.frames * 6000 / sound.rate));
    sound.Window(length / 2, length, type);
}

TEST(sound_filters, AHanningWindowOfFiveFrames)
{
    // A rate of 6000 makes a frame a tick.
    KvoSound sound = MonoSound({1000, 1000, 1000, 1000, 1000}, 6000);

    MultiplyWhole(sound, KvoSound::Hanning);

    const Samples result = SamplesOf(sound);
    EXPECT_EQ(result[0], 0);
    EXPECT_NEAR(result[1], 500, 1);
    EXPECT_NEAR(result[2], 1000, 1);
    EXPECT_NEAR(result[3], 500, 1);
    EXPECT_EQ(result[4], 0);
}

TEST(sound_filters, AllWindowsFollowTheirTables)
{
    std::mt19937 random(73);
    for (std::size_t frames = 1; frames < 40; ++frames)
        for (int channels : {1, 2})
            for (int type = 0; type <= 4; ++type) {
                const auto step = static_cast<std::size_t>(channels);
                const Samples samples = RandomSamples(random, frames * step);
                KvoSound sound = SoundOf(samples, channels, 6000);

                MultiplyWhole(sound, KvoSound::WindowType{type});

                const auto table = literal::Window(type, frames);
                Samples expected = samples;
                for (std::size_t i = 0; type && i < samples.size(); ++i)
                    expected[i] = static_cast<short>(literal::Truncated(
                        static_cast<float>(samples[i]) * table[i / step]));
                ASSERT_EQ(SamplesOf(sound), expected) << type << " " << frames;
            }
}

TEST(sound_filters, WindowsHaveTheirShapes)
{
    auto shape = [](KvoSound::WindowType type) {
        KvoSound sound = MonoSound(Samples(9, 10000), 6000);
        MultiplyWhole(sound, type);
        return SamplesOf(sound);
    };

    EXPECT_EQ(shape(KvoSound::Rectangular), Samples(9, 10000));
    EXPECT_NEAR(shape(KvoSound::Hamming)[0], 800, 1);
    EXPECT_NEAR(shape(KvoSound::Hamming)[4], 10000, 1);
    EXPECT_NEAR(shape(KvoSound::Blackman)[2], 4200, 1);
    EXPECT_NEAR(shape(KvoSound::Blackman)[4], 8400, 1);
    EXPECT_EQ(shape(KvoSound::Triangular),
              (Samples{0, 2500, 5000, 7500, 10000, 7500, 5000, 2500, 0}));
}

TEST(KvoSound, WindowsEndInAZero)
{
    for (auto type :
         {KvoSound::Hamming, KvoSound::Hanning, KvoSound::Blackman}) {
        KvoSound sound = MonoSound(Samples(6, 10000), 6000);
        KvoSound single = MonoSound({10000}, 6000);

        MultiplyWhole(sound, type);
        MultiplyWhole(single, type);

        EXPECT_EQ(sound.samples[5], 0);
        EXPECT_NE(sound.samples[4], 0);
        EXPECT_EQ(single.samples[0], 0);
    }
    KvoSound triangle = MonoSound(Samples(6, 9000), 6000);
    MultiplyWhole(triangle, KvoSound::Triangular);
    EXPECT_EQ(SamplesOf(triangle), (Samples{0, 3000, 9000, 9000, 3000, 0}));
}

TEST(sound_filters, AWindowOfAPartTrimsFirst)
{
    Samples ramp;
    for (short i = 0; i < 100; ++i)
        ramp.push_back(i);
    KvoSound plain = MonoSound(ramp, 6000);
    KvoSound shaped = MonoSound(ramp, 6000);

    plain.Window(KvoTime::FromTicks(50), KvoTime::FromTicks(20),
                 KvoSound::Rectangular);
    shaped.Window(KvoTime::FromTicks(50), KvoTime::FromTicks(20),
                  KvoSound::Triangular);

    EXPECT_EQ(SamplesOf(plain), Samples(ramp.begin() + 40, ramp.begin() + 61));
    EXPECT_EQ(shaped.frames, 21);
    EXPECT_EQ(shaped.samples[0], 0);
    EXPECT_EQ(shaped.samples[10], 50);
    EXPECT_EQ(shaped.samples[5], 45 / 2);
}

TEST(sound_filters, TheRightWidthAroundAnotherCentreTrimsToo)
{
    KvoSound sound = MonoSound({1, 2, 3, 4, 5, 6}, 6000);

    sound.Window(KvoTime::FromTicks(4), KvoTime::FromTicks(6),
                 KvoSound::Rectangular);

    EXPECT_EQ(SamplesOf(sound), (Samples{2, 3, 4, 5, 6}));
}

TEST(sound_filters, AWholeRectangularWindowLeavesTheBufferAlone)
{
    KvoSound sound = MonoSound({1, 2, 3, 4, 5, 6}, 6000);
    const short* buffer = sound.samples;

    MultiplyWhole(sound, KvoSound::Rectangular);

    EXPECT_EQ(sound.samples, buffer);
}

TEST(sound_filters, UnknownWindowsDoNothing)
{
    for (int type : {-1, 5, 100}) {
        KvoSound sound = MonoSound({1, 2, 3}, 6000);

        sound.Window(KvoTime::FromTicks(1), KvoTime::FromTicks(1),
                     static_cast<KvoSound::WindowType>(type));

        EXPECT_EQ(SamplesOf(sound), (Samples{1, 2, 3}));
    }
}

TEST(sound_filters, AWindowOutsideTheSoundEmptiesIt)
{
    KvoSound sound = MonoSound({1, 2, 3}, 6000);

    sound.Window(Seconds(5), Seconds(1), KvoSound::Hanning);

    EXPECT_EQ(sound.samples, nullptr);
    EXPECT_EQ(sound.frames, 0);
}

} // namespace
