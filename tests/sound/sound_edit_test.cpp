#include <KVO/KvoSound.h>

#include <algorithm>
#include <memory>
#include <random>

#include <gtest/gtest.h>

#include "sound/sounds.h"
#include "support/ErrorTrap.h"

namespace {

const std::string too_many =
    "Error: Audio with more than 2 channels is not supported.\n";

/// Samples 1, 2, 3, ...
Samples Counting(int count, int first = 1)
{
    Samples samples;
    for (int i = 0; i < count; ++i)
        samples.push_back(static_cast<short>(first + i));
    return samples;
}

/// Ticks; at 6000 frames a second these are frames.
KvoTime Tick(int ticks)
{
    return KvoTime::FromTicks(ticks);
}

// --- match and concatenation
// -----------------------------------------------------

TEST(sound_edit, MatchTakesRateAndChannelsOver)
{
    KvoSound sound = MonoSound(Counting(100), 22050);
    KvoSound expected = sound;
    expected.Resample(8000);
    expected.Stereo(nullptr);

    sound.Match(StereoSound({{1, 2}}, 8000));

    EXPECT_EQ(sound.rate, 8000);
    EXPECT_EQ(sound.channels, 2);
    EXPECT_EQ(SamplesOf(sound), SamplesOf(expected));
}

TEST(sound_edit, MatchConvertsTheRateBeforeTheChannels)
{
    // As stereo a sound repeats frames; made mono first it would interpolate.
    KvoSound sound = StereoSound({{100, 300}, {500, 700}, {900, 1100}}, 8000);
    KvoSound expected = sound;
    expected.Resample(16000);
    expected.Mono(0);

    sound.Match(MonoSound({1}, 16000));

    EXPECT_EQ(SamplesOf(sound), SamplesOf(expected));
}

TEST(sound_edit, MatchOfEqualRatesFiltersNothing)
{
    KvoSound sound = MonoSound({1, 2, 3});

    sound.Match(MonoSound({9}));

    EXPECT_EQ(SamplesOf(sound), (Samples{1, 2, 3}));
}

TEST(sound_edit, MatchWithAnEmptySoundDoesNothing)
{
    KvoSound sound = MonoSound({1, 2, 3}, 22050);

    sound.Match(KvoSound());

    EXPECT_EQ(sound.rate, 22050);
}

TEST(sound_edit, MatchWithOtherChannelCountsReportsAndDoesNothing)
{
    KvoSound sound = MonoSound({1, 2, 3}, 22050);
    const ErrorTrap reports;

    sound.Match(ThreeChannels());

    EXPECT_EQ(reports.Text(), too_many);
    EXPECT_EQ(sound.rate, 22050);
}

TEST(sound_edit, AStereoSoundJoinedToAMonoOneYieldsMono)
{
    const KvoSound mono = MonoSound(Counting(50), 8000);
    const KvoSound stereo = SoundOf(Counting(200), 2, 22050);
    KvoSound second = stereo;
    second.Match(mono);

    const KvoSound joined = mono + stereo;

    Samples expected = SamplesOf(mono);
    const Samples rest = SamplesOf(second);
    expected.insert(expected.end(), rest.begin(), rest.end());
    EXPECT_EQ(joined.channels, 1);
    EXPECT_EQ(joined.rate, 8000);
    EXPECT_EQ(joined.frames, 50 + 100 * 8000 / 22050);
    EXPECT_EQ(SamplesOf(joined), expected);
    EXPECT_EQ(stereo.rate, 22050);
}

TEST(sound_edit, StereoSoundsAreJoinedFrameByFrame)
{
    const KvoSound joined =
        StereoSound({{1, 2}, {3, 4}}) + StereoSound({{5, 6}});

    EXPECT_EQ(joined.frames, 3);
    EXPECT_EQ(SamplesOf(joined), Counting(6));
}

TEST(sound_edit, ASoundCanBeJoinedToItself)
{
    KvoSound sound = MonoSound({1, 2});

    sound = sound + sound;

    EXPECT_EQ(SamplesOf(sound), (Samples{1, 2, 1, 2}));
}

TEST(sound_edit, JoiningAnEmptySoundGivesTheOtherOne)
{
    const KvoSound full = StereoSound({{1, 2}}, 22050);
    const KvoSound empty;
    const KvoSound no_frames(8000, 1, 0, new short[1]);

    for (const KvoSound& joined :
         {full + empty, empty + full, full + no_frames, no_frames + full}) {
        EXPECT_EQ(SamplesOf(joined), (Samples{1, 2}));
        EXPECT_EQ(joined.rate, 22050);
        EXPECT_EQ(joined.channels, 2);
    }
    EXPECT_EQ((empty + empty).samples, nullptr);
}

TEST(sound_edit, WhatCannotBeFittedIsLeftOut)
{
    const ErrorTrap reports;
    const KvoSound mono = MonoSound({1, 2});
    const KvoSound odd = MonoSound({3, 4}, 0);

    EXPECT_EQ(SamplesOf(mono + ThreeChannels()), (Samples{1, 2}));
    EXPECT_EQ(reports.Text(), too_many);
    EXPECT_EQ(SamplesOf(mono + odd), (Samples{1, 2}));
}

// --- trim and snip
// ---------------------------------------------------------------

TEST(sound_edit, TrimKeepsBothEnds)
{
    KvoSound mono = MonoSound(Counting(10), 6000);
    KvoSound stereo = SoundOf(Counting(10), 2, 6000);

    mono.Trim(Tick(2), Tick(5));
    stereo.Trim(Tick(1), Tick(2));

    EXPECT_EQ(SamplesOf(mono), (Samples{3, 4, 5, 6}));
    EXPECT_EQ(SamplesOf(stereo), (Samples{3, 4, 5, 6}));
    EXPECT_EQ(stereo.frames, 2);
}

TEST(sound_edit, TimesBecomeFramesTruncated)
{
    // At 8000 frames a second a tick is 1.33 frames: 2 are 2.66, 5 are 6.66.
    KvoSound sound = MonoSound(Counting(10));

    sound.Trim(Tick(2), Tick(5));

    EXPECT_EQ(SamplesOf(sound), (Samples{3, 4, 5, 6, 7}));
}

TEST(sound_edit, TrimStopsAtTheLastFrame)
{
    KvoSound sound = MonoSound(Counting(10), 6000);

    sound.Trim(Tick(7), Tick(100));

    EXPECT_EQ(SamplesOf(sound), (Samples{8, 9, 10}));
}

TEST(sound_edit, SnipGoesOnWithZerosPastTheEnd)
{
    KvoSound mono = MonoSound(Counting(10), 6000);
    KvoSound stereo = SoundOf(Counting(4), 2, 6000);
    KvoSound outside = MonoSound(Counting(3), 6000);

    mono.Snip(Tick(7), Tick(11));
    stereo.Snip(Tick(1), Tick(2));
    outside.Snip(Tick(5), Tick(6));

    EXPECT_EQ(SamplesOf(mono), (Samples{8, 9, 10, 0, 0}));
    EXPECT_EQ(SamplesOf(stereo), (Samples{3, 4, 0, 0}));
    EXPECT_EQ(SamplesOf(outside), (Samples{0, 0}));
}

TEST(sound_edit, FramesBeforeTheStartAreZeros)
{
    KvoSound trimmed = MonoSound(Counting(3), 6000);
    KvoSound snipped = SoundOf(Counting(6), 2, 6000);
    KvoSound before = MonoSound(Counting(3), 6000);

    trimmed.Trim(Tick(-2), Tick(1));
    snipped.Snip(Tick(-1), Tick(0));
    before.Trim(Tick(-3), Tick(-2));

    EXPECT_EQ(SamplesOf(trimmed), (Samples{0, 0, 1, 2}));
    EXPECT_EQ(SamplesOf(snipped), (Samples{0, 0, 1, 2}));
    EXPECT_EQ(SamplesOf(before), (Samples{0, 0}));
}

TEST(sound_edit, AnEmptySpanEmptiesTheSound)
{
    KvoSound turned = MonoSound(Counting(10), 6000);
    KvoSound behind = MonoSound(Counting(10), 6000);
    KvoSound snipped = MonoSound(Counting(10), 6000);

    turned.Trim(Tick(5), Tick(4));
    behind.Trim(Tick(10), Tick(20));
    snipped.Snip(Tick(5), Tick(3));

    for (const KvoSound* sound : {&turned, &behind, &snipped}) {
        EXPECT_EQ(sound->samples, nullptr);
        EXPECT_EQ(sound->frames, 0);
        EXPECT_EQ(sound->rate, 6000);
    }
}

TEST(sound_edit, AnEndlessSpanChangesNothing)
{
    KvoSound sound = MonoSound({1, 2, 3}, 44100);

    sound.Snip(Seconds(0), KvoTime::FOREVER);

    EXPECT_EQ(SamplesOf(sound), (Samples{1, 2, 3}));
}

TEST(sound_edit, TimesAtTheGreatestRatesDoNotOverflow)
{
    constexpr long greatest = 9223372036854775807;
    KvoSound trimmed = MonoSound({1, 2, 3}, greatest);
    KvoSound lowest = MonoSound({1, 2, 3}, -greatest - 1);
    KvoSound pasted = MonoSound({1, 2, 3}, greatest);
    KvoSound other = MonoSound({7}, greatest);

    trimmed.Trim(Seconds(0), Seconds(1));
    lowest.Trim(Seconds(-1), Seconds(0));
    pasted.Insert(&other, KvoTime::FOREVER);

    EXPECT_EQ(SamplesOf(trimmed), (Samples{1, 2, 3}));
    EXPECT_EQ(lowest.samples, nullptr); // its times run backward
    EXPECT_EQ(SamplesOf(pasted), (Samples{1, 2, 3}));
    EXPECT_EQ(trimmed.Extract(Seconds(1), Seconds(2)), nullptr);
}

// --- insert
// --------------------------------------------------------------------

TEST(sound_edit, ASecondInsertedHalfASecondBeforeTheStart)
{
    KvoSound sound = MonoSound(Samples(8000, 1));
    KvoSound other = MonoSound(Samples(8000, 2));

    sound.Insert(&other, Seconds(-0.5));

    Samples expected(8000, 2);
    expected.resize(12000, 1);
    EXPECT_EQ(sound.frames, 12000);
    EXPECT_EQ(SamplesOf(sound), expected);
}

TEST(sound_edit, InsertInsideOverwrites)
{
    KvoSound mono = MonoSound(Counting(6), 6000);
    KvoSound stereo = SoundOf(Counting(8), 2, 6000);
    KvoSound other = MonoSound({50, 60}, 6000);
    const short* buffer = mono.samples;

    mono.Insert(&other, Tick(4));
    stereo.Insert(&other, Tick(1));

    EXPECT_EQ(mono.samples, buffer);
    EXPECT_EQ(SamplesOf(mono), (Samples{1, 2, 3, 4, 50, 60}));
    EXPECT_EQ(SamplesOf(stereo), (Samples{1, 2, 50, 50, 60, 60, 7, 8}));
}

TEST(sound_edit, InsertPastTheEndGrowsWithZerosBetween)
{
    KvoSound over = MonoSound({1, 2, 3}, 6000);
    KvoSound gap = MonoSound({1, 2, 3}, 6000);
    KvoSound other = MonoSound({50, 60}, 6000);

    over.Insert(&other, Tick(2));
    gap.Insert(&other, Tick(5));

    EXPECT_EQ(SamplesOf(over), (Samples{1, 2, 50, 60}));
    EXPECT_EQ(SamplesOf(gap), (Samples{1, 2, 3, 0, 0, 50, 60}));
}

TEST(sound_edit, InsertBeforeTheStartKeepsTheLongerOne)
{
    KvoSound apart = MonoSound({1, 2}, 6000);
    KvoSound covered = MonoSound({1, 2}, 6000);
    KvoSound other = MonoSound({50, 60}, 6000);
    KvoSound longer = MonoSound({50, 60, 70, 80, 90}, 6000);

    apart.Insert(&other, Tick(-3));
    covered.Insert(&longer, Tick(-1));

    EXPECT_EQ(SamplesOf(apart), (Samples{50, 60, 0, 1, 2}));
    EXPECT_EQ(SamplesOf(covered), (Samples{50, 60, 70, 80, 90}));
}

TEST(sound_edit, ATimeOfLessThanAFrameIsTheStart)
{
    KvoSound sound = MonoSound({1, 2, 3}, 100);
    KvoSound other = MonoSound({50}, 100);

    sound.Insert(&other, Tick(-59));

    EXPECT_EQ(SamplesOf(sound), (Samples{50, 2, 3}));
}

TEST(KvoSound, InsertConvertsItsSource)
{
    KvoSound mono = MonoSound(Samples(100, 1), 8000);
    KvoSound other = SoundOf(Counting(40), 2, 16000);
    KvoSound expected = other;
    expected.Mono(0);
    expected.Resample(8000);

    mono.Insert(&other, Seconds(0));

    EXPECT_EQ(other.channels, 1);
    EXPECT_EQ(other.rate, 8000);
    EXPECT_EQ(SamplesOf(other), SamplesOf(expected));
    EXPECT_EQ(mono.frames, 100);
    EXPECT_EQ(mono.samples[9], expected.samples[9]);
    EXPECT_EQ(mono.samples[10], 1);
}

TEST(sound_edit, InsertMakesStereoBeforeTheRate)
{
    KvoSound stereo = StereoSound({{1, 2}, {3, 4}}, 16000);
    KvoSound other = MonoSound({100, 300}, 8000);
    KvoSound expected = other;
    expected.Stereo(nullptr);
    expected.Resample(16000);

    stereo.Insert(&other, Seconds(0));

    EXPECT_EQ(SamplesOf(stereo), SamplesOf(expected));
}

TEST(sound_edit, InsertIntoItselfPastesACopy)
{
    KvoSound sound = MonoSound({1, 2, 3}, 6000);

    sound.Insert(&sound, Tick(2));

    EXPECT_EQ(SamplesOf(sound), (Samples{1, 2, 1, 2, 3}));
}

TEST(sound_edit, InsertOfNothingDoesNothing)
{
    KvoSound sound = MonoSound({1, 2, 3});
    KvoSound empty;
    empty.rate = 22050;

    sound.Insert(nullptr, Seconds(5));
    sound.Insert(&empty, Seconds(5));

    EXPECT_EQ(SamplesOf(sound), (Samples{1, 2, 3}));
    EXPECT_EQ(empty.rate, 22050);
}

TEST(sound_edit, InsertOfOtherChannelCountsReportsAndDoesNothing)
{
    KvoSound sound = MonoSound({1, 2, 3}, 22050);
    KvoSound other = ThreeChannels();
    const ErrorTrap reports;

    sound.Insert(&other, Seconds(0));

    EXPECT_EQ(reports.Text(), too_many);
    EXPECT_EQ(SamplesOf(sound), (Samples{1, 2, 3}));
    EXPECT_EQ(other.channels, 3);
    EXPECT_EQ(other.rate, 8000);
}

TEST(sound_edit, InsertTooFarAwayDoesNothing)
{
    KvoSound sound = MonoSound({1, 2, 3}, 44100);
    KvoSound other = MonoSound({4}, 44100);

    sound.Insert(&other, KvoTime::FOREVER);
    sound.Insert(&other, -KvoTime::FOREVER);

    EXPECT_EQ(SamplesOf(sound), (Samples{1, 2, 3}));
}

// --- reverse and extract
// -----------------------------------------------------------

TEST(sound_edit, ReverseTurnsAMonoSoundRound)
{
    KvoSound sound = MonoSound({1, 2, 3});

    sound.Reverse();

    EXPECT_EQ(SamplesOf(sound), (Samples{3, 2, 1}));
}

TEST(KvoSound, ReverseExchangesTheChannels)
{
    KvoSound sound = StereoSound({{10, 20}, {11, 21}});

    sound.Reverse();

    EXPECT_EQ(SamplesOf(sound), (Samples{21, 11, 20, 10}));
}

TEST(sound_edit, ExtractCopiesASpanByTime)
{
    KvoSound sound = SoundOf(Counting(10), 2, 6000);
    sound.width = 4;

    const std::unique_ptr<KvoSound> part(sound.Extract(Tick(1), Tick(2)));

    ASSERT_TRUE(part);
    EXPECT_EQ(SamplesOf(*part), (Samples{3, 4, 5, 6}));
    EXPECT_EQ(part->frames, 2);
    EXPECT_EQ(part->channels, 2);
    EXPECT_EQ(part->rate, 6000);
    EXPECT_EQ(part->width, 4);
    EXPECT_EQ(SamplesOf(sound), Counting(10));
}

TEST(sound_edit, ExtractCopiesASpanByFramesWithinTheSound)
{
    const KvoSound sound = MonoSound(Counting(5));

    const std::unique_ptr<KvoSound> inside(sound.Extract(1, 3));
    const std::unique_ptr<KvoSound> beyond(
        sound.Extract(-100L, 9223372036854775807L));

    EXPECT_EQ(SamplesOf(*inside), (Samples{2, 3, 4}));
    EXPECT_EQ(SamplesOf(*beyond), Counting(5));
}

TEST(sound_edit, ExtractOfNoFramesIsNull)
{
    const KvoSound sound = MonoSound(Counting(5));

    EXPECT_EQ(sound.Extract(3, 2), nullptr);
    EXPECT_EQ(sound.Extract(5, 9), nullptr);
    EXPECT_EQ(sound.Extract(-9, -1), nullptr);
}

template <class First, class Last>
concept Extractable = requires(const KvoSound& sound, First first, Last last)
{
    sound.Extract(first, last);
};

TEST(sound_edit, FractionsOfFramesDoNotCompile)
{
    EXPECT_TRUE((Extractable<int, long>));
    EXPECT_TRUE((Extractable<KvoTime, KvoTime>));
    EXPECT_FALSE((Extractable<double, double>));
    EXPECT_FALSE((Extractable<int, float>));
    EXPECT_FALSE((Extractable<double, int>));
}

// --- all edits against a model
// -------------------------------------------------

/// The frames from `first` to `last` of a model, zeros outside it.
Frames SpanOf(const Frames& frames, int first, int last)
{
    Frames span;
    for (int i = first; i <= last; ++i)
        span.push_back(i >= 0 && i < static_cast<int>(frames.size())
                           ? frames[static_cast<std::size_t>(i)]
                           : std::pair(0, 0));
    return span;
}

/// Lays frames over others, from `at` on; before 0 the others move back.
Frames Laid(Frames under, const Frames& over, int at)
{
    if (at < 0) {
        under = SpanOf(under, at, static_cast<int>(under.size()) - 1);
        at = 0;
    }
    const auto begin = static_cast<std::size_t>(at);
    under.resize(std::max(under.size(), begin + over.size()));
    std::copy(over.begin(), over.end(), under.begin() + at);
    return under;
}

Frames Turned(Frames frames)
{
    std::reverse(frames.begin(), frames.end());
    for (auto& [left, right] : frames)
        std::swap(left, right);
    return frames;
}

TEST(sound_edit, ThousandsOfEditsGiveTheSamplesOfAModel)
{
    std::mt19937 random(83);
    auto number = [&](int least, int most) {
        return least + static_cast<int>(
                           random() % static_cast<unsigned>(most - least + 1));
    };
    auto new_frames = [&](int count, bool stereo) {
        Frames frames;
        for (int i = 0; i < count; ++i) {
            const int left = number(-32768, 32767);
            frames.push_back({left, stereo ? number(-32768, 32767) : left});
        }
        return frames;
    };
    auto sound_of = [](const Frames& frames, bool stereo) {
        KvoSound sound = StereoSound(frames, 6000);
        if (!stereo)
            sound.Mono(1);
        return sound;
    };
    for (int start = 0; start < 200; ++start) {
        const bool stereo = start % 2;
        Frames model = new_frames(number(1, 30), stereo);
        KvoSound sound = sound_of(model, stereo);
        for (int step = 0; step < 20 && !model.empty(); ++step) {
            const int length = static_cast<int>(model.size());
            const int first = number(-3, length + 1);
            const int last = number(-4, length + 4);
            const Frames other = new_frames(number(1, 12), stereo);
            KvoSound other_sound = sound_of(other, stereo);
            switch (number(0, 5)) {
            case 0:
                sound.Trim(Tick(first), Tick(last));
                model = SpanOf(model, first, std::min(last, length - 1));
                break;
            case 1:
                sound.Snip(Tick(first), Tick(last));
                model = SpanOf(model, first, last);
                break;
            case 2:
                sound.Insert(&other_sound, Tick(first));
                model = Laid(model, other, first);
                break;
            case 3:
                sound = sound + other_sound;
                model.insert(model.end(), other.begin(), other.end());
                break;
            case 4:
                sound.Reverse();
                model = Turned(model);
                break;
            default:
                sound.Stereo(nullptr);
                if (!stereo)
                    sound.Mono(number(0, 2));
                break;
            }
            ASSERT_EQ(sound.frames, static_cast<long>(model.size()));
            ASSERT_EQ(SamplesOf(sound), SamplesOf(sound_of(model, stereo)));
        }
    }
}

} // namespace
