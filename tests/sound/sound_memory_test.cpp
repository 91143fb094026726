// What happens when memory runs out, at each request in turn: a sound stays as
// it was or becomes what it should, and nothing is said.

#include <KVO/KvoSound.h>

#include <filesystem>
#include <functional>
#include <memory>

#include <gtest/gtest.h>

#include "sound/aiff_bytes.h"
#include "sound/sounds.h"
#include "support/ErrorTrap.h"
#include "support/FailingMalloc.h"
#include "support/TempDir.h"

namespace {

/// Everything that a sound says about itself.
struct State
{
    explicit State(const KvoSound& sound)
        : samples(SamplesOf(sound)), channels(sound.channels),
          frames(sound.frames), rate(sound.rate)
    {}

    bool operator==(const State&) const = default;

    Samples samples;
    int channels;
    long frames;
    long rate;
};

Samples Ramp(std::size_t count)
{
    Samples samples;
    for (std::size_t i = 0; i < count; ++i)
        samples.push_back(static_cast<short>(100 * i));
    return samples;
}

TEST(sound_memory, EditsHappenWholeOrNotAtAll)
{
    using Edit = std::function<void(KvoSound&)>;
    const Edit edits[] = {
        [](KvoSound& s) { s.Stereo(nullptr); },
        [](KvoSound& s) { s.Mono(0); },
        [](KvoSound& s) { s.Whack(); },
        [](KvoSound& s) { s.Resample(4000); },
        [](KvoSound& s) { s.Speed(2); },
        [](KvoSound& s) { s.PreEmphasis(0.5f); },
        [](KvoSound& s) { s.LoPass(100); },
        [](KvoSound& s) { s.HiPass(100); },
        [](KvoSound& s) { s.BandPass(100, 100); },
        [](KvoSound& s) { s.Reverse(); },
        [](KvoSound& s) { s.Trim(FrameTime(2), FrameTime(5)); },
        [](KvoSound& s) { s.Snip(FrameTime(2), FrameTime(50)); },
        [](KvoSound& s) {
            s.Window(FrameTime(5), FrameTime(6), KvoSound::Triangular);
        },
        [](KvoSound& s) { s.Insert(&s, FrameTime(5)); },
    };
    int failed = 0;
    for (int channels : {1, 2})
        for (const Edit& edit : edits) {
            const KvoSound before = SoundOf(Ramp(20), channels);
            KvoSound expected = before;
            edit(expected);
            std::unique_ptr<KvoSound> sound(new KvoSound(before));
            const State old_state(before);
            const State new_state(expected);

            failed += WithEveryRequestFailing(
                [&] { edit(*sound); },
                [&] {
                    const State state(*sound);
                    EXPECT_TRUE(state == old_state || state == new_state);
                    *sound = before;
                });

            EXPECT_TRUE(State(*sound) == new_state);
        }
    EXPECT_GE(failed, 16);
}

TEST(sound_memory, TwoSoundsStayWholeTogether)
{
    const KvoSound first = MonoSound(Ramp(10));
    const KvoSound second = StereoSound({{1, 2}, {3, 4}, {5, 6}}, 16000);
    KvoSound mono = first;
    KvoSound other = second;
    KvoSound expected_mono = first;
    KvoSound expected_other = second;
    expected_mono.Insert(&expected_other, FrameTime(20));

    const int failed = WithEveryRequestFailing(
        [&] { mono.Insert(&other, FrameTime(20)); },
        [&] {
            EXPECT_TRUE(State(mono) == State(first) ||
                        State(mono) == State(expected_mono));
            EXPECT_TRUE(other.samples);
            mono = first;
            other = second;
        });

    EXPECT_EQ(failed, 3);
    EXPECT_TRUE(State(mono) == State(expected_mono));
}

TEST(sound_memory, AMatchThatFailsHalfWayKeepsAWholeSound)
{
    const KvoSound before = MonoSound(Ramp(20));
    const KvoSound wanted = StereoSound({{1, 2}}, 16000);
    KvoSound sound = before;
    KvoSound expected = before;
    expected.Match(wanted);

    const int failed = WithEveryRequestFailing(
        [&] { sound.Match(wanted); },
        [&] {
            EXPECT_TRUE(sound.frames == 20 || sound.frames == 40);
            EXPECT_EQ(SamplesOf(sound).size(),
                      static_cast<std::size_t>(sound.frames * sound.channels));
            sound = before;
        });

    EXPECT_EQ(failed, 2);
    EXPECT_TRUE(State(sound) == State(expected));
}

TEST(sound_memory, ConstructorsMakeEmptySounds)
{
    const TempDir directory;
    const std::string path = directory.Write("a", PlainAifc());
    const KvoSound original = MonoSound(Ramp(20));
    using Maker = std::function<KvoSound*(void*)>;
    const Maker makers[] = {
        [&](void* at) { return new (at) KvoSound(original); },
        [](void* at) { return new (at) KvoSound(Seconds(0.1), 1); },
        [](void* at) { return new (at) KvoSound(Seconds(0.1), Seconds(0.1)); },
    };
    for (const Maker& maker : makers) {
        alignas(KvoSound) unsigned char place[sizeof(KvoSound)];
        KvoSound* sound = nullptr;

        const int failed =
            WithEveryRequestFailing([&] { sound = maker(place); },
                                    [&] {
                                        EXPECT_EQ(sound->samples, nullptr);
                                        EXPECT_EQ(sound->frames, 0);
                                        sound->~KvoSound();
                                    });

        EXPECT_EQ(failed, 1);
        EXPECT_GT(sound->frames, 0);
        sound->~KvoSound();
    }
}

TEST(sound_memory, ALoadedSoundIsWholeOrEmpty)
{
    const TempDir directory;
    const std::string path = directory.Write("a", PlainAifc());
    const KvoSound warm(path.c_str()); // The library is open from here on.
    const ErrorTrap reports;
    alignas(KvoSound) unsigned char place[sizeof(KvoSound)];
    KvoSound* sound = nullptr;

    const int failed = WithEveryRequestFailing(
        [&] { sound = new (place) KvoSound(path.c_str()); },
        [&] {
            EXPECT_TRUE(sound->frames == 0
                            ? !sound->samples
                            : SamplesOf(*sound) == SamplesOf(warm));
            sound->~KvoSound();
        });

    EXPECT_GE(failed, 2);
    EXPECT_TRUE(State(*sound) == State(warm));
    sound->~KvoSound();
}

TEST(sound_memory, AnAssignmentThatFailsChangesNothing)
{
    const KvoSound source = StereoSound({{1, 2}}, 22050);
    const KvoSound before = MonoSound({7});
    KvoSound sound = before;

    const int failed = WithEveryRequestFailing(
        [&] { sound = source; },
        [&] { EXPECT_TRUE(State(sound) == State(before)); });

    EXPECT_EQ(failed, 1);
    EXPECT_TRUE(State(sound) == State(source));
}

TEST(sound_memory, WhatIsJoinedIsWholeShorterOrEmpty)
{
    const KvoSound a = MonoSound({1, 2});
    const KvoSound b = StereoSound({{3, 3}, {4, 4}});
    alignas(KvoSound) unsigned char place[sizeof(KvoSound)];
    KvoSound* joined = nullptr;

    const int failed = WithEveryRequestFailing(
        [&] { joined = new (place) KvoSound(a + b); },
        [&] {
            const Samples samples = SamplesOf(*joined);
            EXPECT_TRUE(samples.empty() || samples == SamplesOf(a) ||
                        samples == (Samples{1, 2, 3, 4}));
            EXPECT_TRUE(joined->samples || joined->frames == 0);
            joined->~KvoSound();
        });

    EXPECT_GE(failed, 4);
    EXPECT_EQ(SamplesOf(*joined), (Samples{1, 2, 3, 4}));
    joined->~KvoSound();
}

TEST(sound_memory, ExtractsAndNumbersAreNull)
{
    KvoSound sound = MonoSound(Ramp(10));
    KvoSound* part = nullptr;
    float* data = nullptr;

    const int parts = WithEveryRequestFailing(
        [&] { part = sound.Extract(1, 3); }, [&] { EXPECT_EQ(part, nullptr); });
    const int numbers =
        WithEveryRequestFailing([&] { data = sound.ChannelData(4); },
                                [&] { EXPECT_EQ(data, nullptr); });

    EXPECT_EQ(parts, 2);
    EXPECT_EQ(part->frames, 3);
    EXPECT_EQ(numbers, 1);
    EXPECT_EQ(data[1], 100.0f / 32768);
    delete part;
    delete[] data;
}

TEST(sound_memory, ASavedFileIsWholeOrMissing)
{
    const TempDir directory;
    const std::string path = directory.Path("a");
    const KvoSound sound = MonoSound(Ramp(10));
    const ErrorTrap reports;

    const int failed = WithEveryRequestFailing(
        [&] { sound.Save(path.c_str()); },
        [&] {
            if (std::filesystem::exists(path)) {
                EXPECT_TRUE(ReadAifc(directory.Read("a")));
            }
            std::filesystem::remove(path);
        });

    EXPECT_GE(failed, 2);
    EXPECT_TRUE(ReadAifc(directory.Read("a")));
}

TEST(sound_memory, StatsAndMeasuresNeedNone)
{
    KvoSound sound = MonoSound(Ramp(10));
    const FailingMalloc memory(0);

    sound.ComputeMinMax();
    const float volume = sound.Volume();

    EXPECT_EQ(sound.max, 900);
    EXPECT_GT(volume, 0);
    EXPECT_EQ(memory.Requests(), 0);
}

} // namespace
