#include <KVO/KvoSound.h>

#include <cmath>
#include <cstddef>
#include <iostream>
#include <locale>
#include <memory>
#include <sstream>
#include <type_traits>

#include <gtest/gtest.h>

#include "sound/literal.h"
#include "sound/sounds.h"
#include "support/ErrorTrap.h"
#include "support/FakeRandom.h"
#include "support/OtherLocale.h"

namespace {

const std::string too_many =
    "Error: Audio with more than 2 channels is not supported.\n";

/// What is printed on standard output while it lives.
class CapturedStdout
{
public:
    CapturedStdout() : before(std::cout.rdbuf(text.rdbuf())) {}
    ~CapturedStdout() { std::cout.rdbuf(before); }
    CapturedStdout(const CapturedStdout&) = delete;
    CapturedStdout& operator=(const CapturedStdout&) = delete;

    std::ostringstream text;

private:
    std::streambuf* before;
};

// --- fields and construction -------------------------------------------------

TEST(KvoSound, FieldsStandInTheirOrder)
{
    struct Fields : KvoSound
    {};
    const KvoSound sound;
    auto place = [&](const auto& field) {
        return reinterpret_cast<const char*>(&field) -
               reinterpret_cast<const char*>(&sound);
    };

    EXPECT_LT(place(sound.format), place(sound.width));
    EXPECT_LT(place(sound.width), place(sound.channels));
    EXPECT_LT(place(sound.channels), place(sound.frames));
    EXPECT_LT(place(sound.frames), place(sound.rate));
    EXPECT_LT(place(sound.rate), place(sound.min));
    EXPECT_LT(place(sound.min), place(sound.max));
    EXPECT_LT(place(sound.max), place(sound.samples));
}

TEST(KvoSound, TheDefaultIsAnEmptyMonoSoundAt8000Hertz)
{
    const KvoSound sound;

    EXPECT_EQ(sound.format, 1);
    EXPECT_EQ(sound.width, 2);
    EXPECT_EQ(sound.channels, 1);
    EXPECT_EQ(sound.frames, 0);
    EXPECT_EQ(sound.rate, 8000);
    EXPECT_EQ(sound.min, 0);
    EXPECT_EQ(sound.max, 0);
    EXPECT_EQ(sound.samples, nullptr);
}

TEST(KvoSound, ADefaultSoundHasNoVolumeAndNoRange)
{
    KvoSound sound;
    sound.min = 5;
    sound.max = 6;

    sound.ComputeMinMax();

    EXPECT_EQ(sound.Volume(), 0);
    EXPECT_EQ(sound.min, 0);
    EXPECT_EQ(sound.max, 0);
}

TEST(KvoSound, ACopyHasEveryFieldAndABufferOfItsOwn)
{
    for (int channels : {1, 2}) {
        KvoSound sound = SoundOf({1, -2, 3, 4}, channels, 22050);
        sound.width = 4;
        sound.format = 7;
        sound.ComputeMinMax();

        const KvoSound copy(sound);

        EXPECT_EQ(copy.format, 7);
        EXPECT_EQ(copy.width, 4);
        EXPECT_EQ(copy.channels, channels);
        EXPECT_EQ(copy.frames, 4 / channels);
        EXPECT_EQ(copy.rate, 22050);
        EXPECT_EQ(copy.min, -2);
        EXPECT_EQ(copy.max, 4);
        EXPECT_NE(copy.samples, sound.samples);
        EXPECT_EQ(SamplesOf(copy), SamplesOf(sound));
    }
}

TEST(KvoSound, ACopyOfOtherCountsHoldsTwoSamplesAFrame)
{
    const KvoSound sound = ThreeChannels();

    const KvoSound copy(sound);

    EXPECT_EQ(copy.channels, 3);
    ASSERT_EQ(copy.frames, 2);
    EXPECT_EQ(Samples(copy.samples, copy.samples + 4), (Samples{1, 2, 3, 4}));
}

TEST(KvoSound, ACopyOfAnEmptySoundIsEmpty)
{
    const KvoSound empty;

    const KvoSound copy(empty);

    EXPECT_EQ(copy.samples, nullptr);
    EXPECT_EQ(copy.frames, 0);
}

TEST(KvoSound, SilenceIsMonoAt44100Hertz)
{
    const KvoSound sound(Seconds(1.3), 0);

    EXPECT_EQ(sound.channels, 1);
    EXPECT_EQ(sound.width, 2);
    EXPECT_EQ(sound.rate, 44100);
    EXPECT_EQ(sound.frames, 57330);
    EXPECT_EQ(SamplesOf(sound), Samples(57330, 0));
}

TEST(KvoSound, OneSecondOfNoiseIsTheSameEachTime)
{
    const KvoSound first(KvoTime(0, 0, 1, 0), 1);
    srandom(99);
    const KvoSound second(KvoTime(0, 0, 1, 0), 1);

    ASSERT_EQ(first.frames, 44100);
    EXPECT_EQ(SamplesOf(first), SamplesOf(second));
    EXPECT_NE(SamplesOf(first), Samples(44100, 0));
}

TEST(KvoSound, NoiseIsTheLowBitsOfDrawsLessNine)
{
    FakeRandom dice;
    dice.numbers = {0x7FFFFFFF, 0x01000000, 0x1FF, 0x00FFFE00};

    const KvoSound sound(KvoTime::FromTicks(1), 1); // 7 frames.

    EXPECT_EQ(dice.last_seed, 0u);
    EXPECT_EQ(dice.draws, 7);
    EXPECT_EQ(SamplesOf(sound), (Samples{-1, -32768, 0, 32767, 0, 0, 0}));
}

TEST(KvoSound, NoiseSeedsTheProcessesRandomNumbers)
{
    srandom(0);
    Samples expected;
    for (int i = 0; i < 44; ++i)
        expected.push_back(static_cast<short>(random() >> 9));

    const KvoSound sound(KvoTime::FromTicks(6), 1);
    const long next = random();

    srandom(0);
    for (int i = 0; i < 44; ++i)
        random();
    EXPECT_EQ(SamplesOf(sound), expected);
    EXPECT_EQ(next, random());
}

TEST(KvoSound, SilenceSeedsNothing)
{
    FakeRandom dice;

    const KvoSound sound(Seconds(1), 0);

    EXPECT_EQ(dice.draws, 0);
    EXPECT_EQ(dice.last_seed, 0xFFFFFFFF);
}

TEST(KvoSound, NoOrNegativeOrEndlessLengthsMakeEmptySounds)
{
    for (KvoTime length : {KvoTime::ZERO, Seconds(-1), KvoTime::FOREVER,
                           KvoTime::FromTicks(0)}) {
        const KvoSound sound(length, 1);

        EXPECT_EQ(sound.frames, 0);
        EXPECT_EQ(sound.samples, nullptr);
        EXPECT_EQ(sound.rate, 44100);
    }
}

TEST(KvoSound, ALeaderOfHalfASecondOfPadHasClicksAtBothEnds)
{
    const KvoSound sound(KvoTime(0, 0, 1, 0), KvoTime(0, 0, 0, 15));

    Samples expected(16000, 0);
    for (std::size_t i = 0; i < 4000; i += 10) {
        expected[i] = 16000;
        expected[12000 + i] = 16000;
    }
    EXPECT_EQ(sound.channels, 1);
    EXPECT_EQ(sound.rate, 8000);
    EXPECT_EQ(sound.frames, 16000);
    EXPECT_EQ(SamplesOf(sound), expected);
}

TEST(KvoSound, ALeaderIsTruncatedAsAWhole)
{
    // A tick is 1.33 frames: 3 and 2 * 2 ticks are 9.33 frames, pads of 2.66.
    const KvoSound sound(KvoTime::FromTicks(3), KvoTime::FromTicks(2));

    EXPECT_EQ(SamplesOf(sound), (Samples{16000, 0, 0, 0, 0, 0, 0, 16000, 0}));
}

TEST(KvoSound, OddLeadersStayInTheirBuffer)
{
    const KvoSound overlapping(Seconds(-0.5), Seconds(0.5));
    const KvoSound begins_outside(Seconds(-0.9), Seconds(0.5));
    const KvoSound negative_pad(Seconds(1), Seconds(-0.25));
    const KvoSound nothing(Seconds(-1), Seconds(0.5));
    const KvoSound endless(KvoTime::FOREVER, KvoTime::FOREVER);

    EXPECT_EQ(overlapping.frames, 4000);
    EXPECT_EQ(overlapping.samples[0], 16000);
    // Its last pad would begin 3200 frames before the sound.
    Samples clicks(800, 0);
    for (std::size_t i = 0; i < clicks.size(); i += 10)
        clicks[i] = 16000;
    EXPECT_EQ(SamplesOf(begins_outside), clicks);
    EXPECT_EQ(SamplesOf(negative_pad), Samples(4000, 0));
    EXPECT_EQ(nothing.frames, 0);
    EXPECT_EQ(nothing.samples, nullptr);
    EXPECT_EQ(endless.samples, nullptr);
}

TEST(KvoSound, AGivenBufferIsAdopted)
{
    short* buffer = new short[6]{1, 2, 3, 4, 5, 6};

    const KvoSound sound(11025, 2, 3, buffer);

    EXPECT_EQ(sound.samples, buffer);
    EXPECT_EQ(sound.format, 1);
    EXPECT_EQ(sound.width, 2);
    EXPECT_EQ(sound.channels, 2);
    EXPECT_EQ(sound.frames, 3);
    EXPECT_EQ(sound.rate, 11025);
}

TEST(KvoSound, AnyChannelCountButOneMeansStereo)
{
    for (int channels : {0, 2, 3, -1})
        EXPECT_EQ(KvoSound(8000, channels, 0, nullptr).channels, 2);
    EXPECT_EQ(KvoSound(8000, 1, 0, nullptr).channels, 1);
}

TEST(KvoSound, OddAdoptedCountsMakeNoFrames)
{
    const KvoSound negative(8000, 1, -4, new short[1]);
    const KvoSound too_long(8000, 1, 2147483648, new short[1]);

    EXPECT_EQ(negative.frames, 0);
    EXPECT_EQ(too_long.frames, 0);
    EXPECT_EQ(too_long.samples, nullptr);
}

TEST(KvoSound, FractionsOfNoiseAndOfFramesDoNotCompile)
{
    EXPECT_TRUE((std::is_constructible_v<KvoSound, KvoTime, int>));
    EXPECT_TRUE((std::is_constructible_v<KvoSound, KvoTime, KvoTime>));
    EXPECT_FALSE((std::is_constructible_v<KvoSound, KvoTime, double>));
    EXPECT_FALSE((std::is_constructible_v<KvoSound, KvoTime, float>));
}

TEST(KvoSound, StatsAndTheDestructorAreVirtual)
{
    struct Quiet : KvoSound
    {
        explicit Quiet(bool& was_destroyed) : gone(was_destroyed) {}
        ~Quiet() override { gone = true; }
        void Stats() const override { std::cout << "none"; }
        bool& gone;
    };
    CapturedStdout out;
    bool gone = false;

    {
        const std::unique_ptr<KvoSound> sound(new Quiet(gone));
        sound->Stats();
    }

    EXPECT_EQ(out.text.str(), "none");
    EXPECT_TRUE(gone);
}

// --- measuring ---------------------------------------------------------------

TEST(KvoSound, MinAndMaxAreOfBothChannelsTogether)
{
    KvoSound sound = StereoSound({{5, -7}, {9, 3}});

    sound.ComputeMinMax();

    EXPECT_EQ(sound.min, -7);
    EXPECT_EQ(sound.max, 9);
}

TEST(KvoSound, MinAndMaxStartAtTheFirstSample)
{
    KvoSound below = MonoSound({-5, -9});
    KvoSound above = MonoSound({5, 9});

    below.ComputeMinMax();
    above.ComputeMinMax();

    EXPECT_EQ(below.max, -5);
    EXPECT_EQ(below.min, -9);
    EXPECT_EQ(above.min, 5);
    EXPECT_EQ(above.max, 9);
}

TEST(KvoSound, MinAndMaxOfOtherCountsAreThoseOfTwoSamplesAFrame)
{
    const ErrorTrap reports;
    KvoSound sound = ThreeChannels();

    sound.ComputeMinMax();

    EXPECT_EQ(sound.min, 1);
    EXPECT_EQ(sound.max, 4);
    EXPECT_EQ(reports.Text(), "");
}

TEST(KvoSound, VolumeIsTheRootMeanSquare)
{
    EXPECT_FLOAT_EQ(MonoSound({-32768, -32768}).Volume(), 1.0f);
    EXPECT_FLOAT_EQ(MonoSound({16384, -16384}).Volume(), 0.5f);
    EXPECT_FLOAT_EQ(MonoSound({16384, 0}).Volume(), std::sqrt(0.125f));
    EXPECT_FLOAT_EQ(StereoSound({{16384, 0}, {0, 16384}}).Volume(),
                    std::sqrt(0.125f));
}

TEST(KvoSound, VolumeOfOtherCountsIsZeroWithoutAWord)
{
    const ErrorTrap reports;
    const KvoSound sound = ThreeChannels();

    EXPECT_EQ(sound.Volume(), 0);
    EXPECT_EQ(reports.Text(), "");
}

TEST(KvoSound, VolumeSumsUpInSinglePrecision)
{
    // From a sum of 2^24 squares of 1 on nothing more can be added.
    const Samples samples((1 << 24) + 3000000, -32768);
    const KvoSound sound = MonoSound(samples);

    const float volume = sound.Volume();

    EXPECT_EQ(volume,
              std::sqrt(16777216.0f / static_cast<float>(samples.size())));
    EXPECT_LT(volume, 1.0f);
}

TEST(KvoSound, StatsPrintsThreeLines)
{
    CapturedStdout out;
    KvoSound sound(44100, 2, 57330, nullptr);

    sound.Stats();

    EXPECT_EQ(out.text.str(), "Sample frequency : 44100 hz\n"
                              "Frame count      : 57330\n"
                              "Length           : 1.3 seconds\n");
}

TEST(KvoSound, StatsDoesNotDependOnTheLocale)
{
    const OtherLocale german("de_DE");
    CapturedStdout out;
    std::cout.imbue(std::locale());
    const KvoSound sound(44100, 2, 57330, nullptr);

    sound.Stats();

    std::cout.imbue(std::locale::classic());
    EXPECT_EQ(out.text.str(), "Sample frequency : 44100 hz\n"
                              "Frame count      : 57330\n"
                              "Length           : 1.3 seconds\n");
}

TEST(KvoSound, StatsOfAnEmptySoundAndOfOddRates)
{
    for (auto [rate, frames, length] :
         {std::tuple(8000L, 0L, "0"), std::tuple(0L, 100L, "0"),
          std::tuple(-5L, 100L, "0"), std::tuple(7L, 1L, "0.142833"),
          std::tuple(1L, 2147483647L, "357914")}) {
        CapturedStdout out;
        const KvoSound sound(rate, 1, frames, nullptr);

        sound.Stats();

        EXPECT_EQ(out.text.str(),
                  "Sample frequency : " + std::to_string(rate) +
                      " hz\nFrame count      : " + std::to_string(frames) +
                      "\nLength           : " + length + " seconds\n");
    }
}

TEST(KvoSound, ChannelDataIsTheMonoSoundAsNumbers)
{
    KvoSound sound = StereoSound({{-32768, -32768}, {3, 0}, {16384, 16384}});

    const std::unique_ptr<float[]> data(sound.ChannelData(4));

    ASSERT_TRUE(data);
    EXPECT_EQ(data[0], -1.0f);
    EXPECT_EQ(data[1], 1.0f / 32768);
    EXPECT_EQ(data[2], 0.5f);
    EXPECT_EQ(sound.channels, 1);
    EXPECT_EQ(sound.frames, 3);
}

TEST(KvoSound, ChannelDataReportsAndGivesNullForAnythingButMono)
{
    KvoSound full = StereoSound({{1, 2}});
    KvoSound empty;
    for (KvoSound* sound : {&full, &empty})
        for (int which : {0, 1, 2, 3, 5, -1}) {
            const ErrorTrap reports;

            const float* data = sound->ChannelData(which);

            EXPECT_EQ(data, nullptr);
            EXPECT_EQ(reports.Text(),
                      "Error: Only MONO channel data allowed.\n");
        }
    EXPECT_EQ(full.channels, 2);
}

TEST(KvoSound, ChannelDataOfNothingIsNull)
{
    const ErrorTrap reports;
    KvoSound empty;

    EXPECT_EQ(empty.ChannelData(4), nullptr);
    EXPECT_EQ(reports.Text(), "");
}

// --- channels ----------------------------------------------------------------

TEST(KvoSound, StereoRepeatsTheSamplesOfAMonoSound)
{
    KvoSound sound = MonoSound({1, 2, 3});

    sound.Stereo(nullptr);

    EXPECT_EQ(sound.channels, 2);
    EXPECT_EQ(sound.frames, 3);
    EXPECT_EQ(SamplesOf(sound), (Samples{1, 1, 2, 2, 3, 3}));
}

TEST(KvoSound, StereoTakesTheRightSamplesFromAnotherSound)
{
    KvoSound sound = MonoSound({1, 2, 3});
    const KvoSound right = MonoSound({7, 8, 9, 10});

    sound.Stereo(&right);

    EXPECT_EQ(SamplesOf(sound), (Samples{1, 7, 2, 8, 3, 9}));
}

TEST(KvoSound, MissingRightSamplesAreZero)
{
    KvoSound short_right = MonoSound({1, 2, 3});
    KvoSound no_right = MonoSound({1, 2, 3});
    const KvoSound right = MonoSound({7});
    const KvoSound empty;

    short_right.Stereo(&right);
    no_right.Stereo(&empty);

    EXPECT_EQ(SamplesOf(short_right), (Samples{1, 7, 2, 0, 3, 0}));
    EXPECT_EQ(SamplesOf(no_right), (Samples{1, 0, 2, 0, 3, 0}));
}

TEST(KvoSound, StereoOfItselfRepeatsItsSamples)
{
    KvoSound sound = MonoSound({1, 2});

    sound.Stereo(&sound);

    EXPECT_EQ(SamplesOf(sound), (Samples{1, 1, 2, 2}));
}

TEST(KvoSound, StereoOfAStereoSoundDoesNothing)
{
    KvoSound sound = StereoSound({{1, 2}});
    const short* buffer = sound.samples;

    sound.Stereo(nullptr);

    EXPECT_EQ(sound.samples, buffer);
    EXPECT_EQ(sound.channels, 2);
}

TEST(KvoSound, MonoAveragesEachPairTowardZero)
{
    KvoSound sound = StereoSound(
        {{-3, 0}, {3, 0}, {-32768, -32768}, {32767, 32767}, {-32768, 32767}});

    sound.Mono(0);

    EXPECT_EQ(sound.channels, 1);
    EXPECT_EQ(sound.frames, 5);
    EXPECT_EQ(SamplesOf(sound), (Samples{-1, 1, -32768, 32767, 0}));
}

TEST(KvoSound, MonoPicksAChannel)
{
    KvoSound left = StereoSound({{1, 2}, {3, 4}});
    KvoSound right = left;

    left.Mono(1);
    right.Mono(2);

    EXPECT_EQ(SamplesOf(left), (Samples{1, 3}));
    EXPECT_EQ(SamplesOf(right), (Samples{2, 4}));
}

TEST(KvoSound, MonoOfABadChannelReportsAndGoesOn)
{
    for (int channel : {3, -1, 100}) {
        KvoSound sound = StereoSound({{1, 2}, {3, 4}});
        const ErrorTrap reports;

        sound.Mono(channel);

        EXPECT_EQ(reports.Text(),
                  "Error: Must choose either channel 1 or 2.\n");
        EXPECT_EQ(sound.channels, 1);
        EXPECT_EQ(SamplesOf(sound), (Samples{0, 0}));
    }
}

TEST(KvoSound, MonoOfAMonoSoundDoesNothingNotEvenReport)
{
    KvoSound sound = MonoSound({1, 2});
    const ErrorTrap reports;

    sound.Mono(3);

    EXPECT_EQ(SamplesOf(sound), (Samples{1, 2}));
    EXPECT_EQ(reports.Text(), "");
}

TEST(KvoSound, RandomStereoSoundsAreAveragedLikeTheLiteralOnes)
{
    std::mt19937 random(61);
    for (std::size_t frames = 0; frames < 200; ++frames) {
        const Samples samples = RandomSamples(random, 2 * frames);
        KvoSound sound = SoundOf(samples, 2);

        sound.Mono(0);

        ASSERT_EQ(SamplesOf(sound), literal::Mono(samples));
    }
}

TEST(KvoSound, WhackPutsAveragesBetweenNeighbours)
{
    KvoSound sound = MonoSound({10, 13, 10, -3}, 8000);

    sound.Whack();

    EXPECT_EQ(sound.frames, 8);
    EXPECT_EQ(sound.rate, 8000);
    EXPECT_EQ(SamplesOf(sound), (Samples{10, 11, 13, 11, 10, 3, 0, 0}));
}

TEST(KvoSound, WhackAveragesTowardZeroAtTheEnds)
{
    KvoSound sound = MonoSound({-32768, -32768, 0, -3, 0});

    sound.Whack();

    EXPECT_EQ(SamplesOf(sound),
              (Samples{-32768, -32768, -32768, -16384, 0, -1, -3, -1, 0, 0}));
}

TEST(KvoSound, WhackLeavesZerosLast)
{
    KvoSound sound = MonoSound({500});

    sound.Whack();

    EXPECT_EQ(SamplesOf(sound), (Samples{0, 0}));
}

TEST(KvoSound, WhackOfAStereoSoundDoesNothing)
{
    KvoSound sound = StereoSound({{1, 2}, {3, 4}});

    sound.Whack();

    EXPECT_EQ(SamplesOf(sound), (Samples{1, 2, 3, 4}));
}

// --- copying -----------------------------------------------------------------

TEST(KvoSound, AssignmentCopiesAllButMinAndMax)
{
    KvoSound source = StereoSound({{1, 2}, {3, 4}}, 11025);
    source.width = 1;
    source.format = 3;
    source.ComputeMinMax();
    KvoSound sound = MonoSound({9});
    sound.min = -5;
    sound.max = 6;

    KvoSound& result = sound = source;

    EXPECT_EQ(&result, &sound);
    EXPECT_EQ(sound.rate, 11025);
    EXPECT_EQ(sound.width, 1);
    EXPECT_EQ(sound.format, 3);
    EXPECT_EQ(sound.channels, 2);
    EXPECT_EQ(SamplesOf(sound), (Samples{1, 2, 3, 4}));
    EXPECT_NE(sound.samples, source.samples);
    EXPECT_EQ(sound.min, -5);
    EXPECT_EQ(sound.max, 6);
}

TEST(KvoSound, AssignmentOfItselfAndOfAnEmptySound)
{
    KvoSound sound = MonoSound({1, 2});
    const KvoSound& same = sound;

    sound = same;
    EXPECT_EQ(SamplesOf(sound), (Samples{1, 2}));

    sound = KvoSound();
    EXPECT_EQ(sound.samples, nullptr);
    EXPECT_EQ(sound.frames, 0);
}

TEST(KvoSound, CopySamplesCopiesFrames)
{
    const short source[] = {1, 2, 3, 4, 5, 6};
    short mono[] = {0, 0, 0, 0, 0, 0};
    short stereo[] = {0, 0, 0, 0, 0, 0};
    short many[] = {0, 0, 0, 0, 0, 0};

    KvoSound::CopySamples(mono, source, 2, 3, 1);
    KvoSound::CopySamples(stereo, source, 2, 1, 2);
    KvoSound::CopySamples(many, source, 1, 2, 7);

    EXPECT_EQ(Samples(mono, mono + 6), (Samples{0, 0, 0, 1, 2, 0}));
    EXPECT_EQ(Samples(stereo, stereo + 6), (Samples{0, 0, 1, 2, 3, 4}));
    EXPECT_EQ(Samples(many, many + 6), (Samples{0, 0, 0, 0, 1, 2}));
}

TEST(KvoSound, CopySamplesLeavesOutWhatWouldLieBeforeTheStart)
{
    const short source[] = {1, 2, 3, 4, 5, 6};
    short to[] = {0, 0, 0};
    short stereo[] = {0, 0, 0, 0};

    KvoSound::CopySamples(to, source, 3, -2, 1);
    KvoSound::CopySamples(stereo, source, 3, -1, 2);
    KvoSound::CopySamples(to + 1, source, 2, -2, 1);
    KvoSound::CopySamples(to, source, -3, 0, 1);
    KvoSound::CopySamples(to, source, -1, -7, 1);
    KvoSound::CopySamples(to, source, 3, -9223372036854775807L - 1, 1);
    KvoSound::CopySamples(nullptr, source, 3, 0, 1);
    KvoSound::CopySamples(to, nullptr, 3, 0, 1);

    EXPECT_EQ(Samples(to, to + 3), (Samples{3, 0, 0}));
    EXPECT_EQ(Samples(stereo, stereo + 4), (Samples{3, 4, 5, 6}));
}

// --- sounds that cannot be worked on
// ------------------------------------------

TEST(KvoSound, OtherChannelCountsGiveOneErrorAndNoChange)
{
    using Operation = void (*)(KvoSound&);
    const Operation operations[] = {
        [](KvoSound& s) { s.Stereo(nullptr); },
        [](KvoSound& s) { s.Mono(0); },
        [](KvoSound& s) { s.Mono(7); },
        [](KvoSound& s) { s.Whack(); },
        [](KvoSound& s) { EXPECT_EQ(s.ChannelData(4), nullptr); },
        [](KvoSound& s) { s.Match(MonoSound({1})); },
        [](KvoSound& s) { s.Resample(4000); },
        [](KvoSound& s) { s.Resample(0); },
        [](KvoSound& s) { s.Speed(2); },
        [](KvoSound& s) { s.Speed(0); },
        [](KvoSound& s) { s.PreEmphasis(0.5f); },
        [](KvoSound& s) { s.Trim(Seconds(0), Seconds(1)); },
        [](KvoSound& s) { s.Snip(Seconds(0), Seconds(1)); },
        [](KvoSound& s) {
            KvoSound other = MonoSound({1});
            s.Insert(&other, Seconds(0));
        },
        [](KvoSound& s) { s.Insert(&s, Seconds(0)); },
        [](KvoSound& s) { s.Reverse(); },
        [](KvoSound& s) { s.LoPass(100); },
        [](KvoSound& s) { s.HiPass(100); },
        [](KvoSound& s) { s.BandPass(100, 10); },
        [](KvoSound& s) {
            s.Window(Seconds(1), Seconds(1), KvoSound::Hanning);
        },
        [](KvoSound& s) { EXPECT_EQ(s.Extract(0, 1), nullptr); },
        [](KvoSound& s) {
            EXPECT_EQ(s.Extract(Seconds(0), Seconds(1)), nullptr);
        },
    };
    for (int channels : {3, 0, -1})
        for (Operation operation : operations) {
            KvoSound sound = ThreeChannels();
            sound.channels = channels;
            const short* buffer = sound.samples;
            const ErrorTrap reports;

            operation(sound);

            EXPECT_EQ(reports.Text(), too_many);
            EXPECT_EQ(sound.samples, buffer);
            EXPECT_EQ(Samples(buffer, buffer + 6), (Samples{1, 2, 3, 4, 5, 6}));
            EXPECT_EQ(sound.channels, channels);
            EXPECT_EQ(sound.frames, 2);
            EXPECT_EQ(sound.rate, 8000);
        }
}

TEST(KvoSound, WithoutABufferNothingHappensAndNothingIsSaid)
{
    for (auto [channels, frames] :
         {std::pair(1, 0), std::pair(2, 0), std::pair(3, 0), std::pair(1, 9),
          std::pair(2, 9), std::pair(3, 9)}) {
        KvoSound sound;
        sound.channels = channels;
        sound.frames = frames;
        KvoSound other = MonoSound({1, 2});
        const ErrorTrap reports;

        sound.Stereo(&other);
        sound.Mono(1);
        sound.Whack();
        sound.Match(other);
        sound.Resample(4000);
        sound.Speed(2);
        sound.PreEmphasis(0.5f);
        sound.Trim(Seconds(0), Seconds(1));
        sound.Snip(Seconds(0), Seconds(1));
        sound.Insert(&other, Seconds(0));
        sound.Reverse();
        sound.LoPass(10);
        sound.HiPass(10);
        sound.BandPass(10, 10);
        sound.Window(Seconds(0), Seconds(0), KvoSound::Hamming);
        sound.ComputeMinMax();
        other.Match(sound);
        other.Insert(&sound, Seconds(0));
        const KvoSound copy(sound);
        const KvoSound before = sound + other;
        const KvoSound behind = other + sound;

        EXPECT_EQ(copy.samples, nullptr);
        EXPECT_EQ(SamplesOf(before), (Samples{1, 2}));
        EXPECT_EQ(SamplesOf(behind), (Samples{1, 2}));
        EXPECT_EQ(sound.Extract(0, 1), nullptr);
        EXPECT_EQ(sound.Extract(Seconds(0), Seconds(1)), nullptr);
        EXPECT_EQ(sound.ChannelData(4), nullptr);
        EXPECT_EQ(sound.Volume(), 0);
        EXPECT_EQ(sound.samples, nullptr);
        EXPECT_EQ(sound.frames, frames);
        EXPECT_EQ(sound.channels, channels);
        EXPECT_EQ(sound.rate, 8000);
        EXPECT_EQ(SamplesOf(other), (Samples{1, 2}));
        EXPECT_EQ(reports.Text(), "");
    }
}

TEST(KvoSound, ABufferOfNoFramesChangesItsChannelsLikeOthers)
{
    KvoSound widened(8000, 1, 0, new short[2]);
    KvoSound mixed(8000, 2, 0, new short[2]);

    widened.Stereo(nullptr);
    mixed.Mono(0);

    EXPECT_EQ(widened.channels, 2);
    EXPECT_EQ(widened.frames, 0);
    EXPECT_EQ(mixed.channels, 1);
    EXPECT_EQ(mixed.frames, 0);
}

TEST(KvoSound, ABufferOfNoFramesSurvivesEverything)
{
    for (int channels : {1, 2}) {
        KvoSound sound(8000, channels, 0, new short[2]);
        KvoSound other = MonoSound({1, 2});

        EXPECT_EQ(sound.Volume(), 0);
        sound.ComputeMinMax();
        sound.LoPass(10);
        sound.HiPass(10);
        sound.BandPass(10, 10);
        sound.PreEmphasis(0.5f);
        sound.Reverse();
        sound.Whack();
        sound.Stereo(nullptr);
        sound.Mono(0);
        sound.Resample(4000);
        sound.Insert(&other, Seconds(0));

        EXPECT_TRUE(sound.frames == 0 || sound.frames == 1 ||
                    sound.frames == 2);
    }
}

} // namespace
