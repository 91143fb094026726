#ifndef ZT_TESTS_SOUND_SOUNDTEST_H
#define ZT_TESTS_SOUND_SOUNDTEST_H

#include <cstdint>
#include <numeric>
#include <string>
#include <vector>

#include "ZT/sound.h"
#include "sound/sounds.h"
#include "support/BeatTest.h"
#include "support/FakeAudioDevice.h"

/// Sounds on a device in memory, with timers by a fake clock; sound control is
/// at its defaults before and after each test.
class SoundTest : public BeatTest
{
protected:
    SoundTest() { ZtTimerBeat::start(); }

    ~SoundTest() override
    {
        ZtSoundControl::play_speed = 1.0F;
        // Timers are gone by now; what belongs to them goes too.
        ZtSoundControl::RecordSetFrequency(8000);
        ZtSoundControl::RecordSetStereo(0);
        EXPECT_EQ(device.ready_ports, 0);
        EXPECT_EQ(device.open_ports, 0);
    }

    /// Lets beats come for this long.
    void RunFor(double seconds) { alarm.Run(static_cast<long>(seconds * 1e6)); }

    /// Starts a timer from its beginning; it runs when this returns.
    void Start(ZtTimer& timer)
    {
        timer.restart();
        Beats(1);
    }

    /// Starts a timer so that what is posted for its start begins a whole
    /// number of 100 ms after the beat did: repeats of 100 ms then come a whole
    /// number of 100 ms later.
    void StartInStep(ZtTimer& timer)
    {
        while ((Milliseconds() + 8) % 100 != 0)
            Beats(1);
        Start(timer);
        Beats(1);
    }

    FakeAudioDevice device;
    BeatErrorTrap reports;
};

/// Gives samples 0, 1, 2, ... as far as samples go, again and again.
inline Samples Ramp(std::size_t count, int first = 0)
{
    Samples samples(count);
    for (std::size_t place = 0; place < count; ++place)
        samples[place] =
            static_cast<short>((static_cast<int>(place) + first) % 32000);
    return samples;
}

inline Samples Backward(Samples samples)
{
    return {samples.rbegin(), samples.rend()};
}

/// Gives the samples from `first` on, `count` of them at most.
inline Samples Part(const Samples& samples, std::size_t first,
                    std::size_t count = ~std::size_t{0})
{
    if (first >= samples.size())
        return {};
    const std::size_t size = std::min(count, samples.size() - first);
    const auto begin = samples.begin() + static_cast<std::ptrdiff_t>(first);
    return {begin, begin + static_cast<std::ptrdiff_t>(size)};
}

#endif
