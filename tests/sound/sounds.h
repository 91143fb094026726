#ifndef ZT_TESTS_SOUND_SOUNDS_H
#define ZT_TESTS_SOUND_SOUNDS_H

#include <KVO/KvoSound.h>

#include <random>
#include <utility>
#include <vector>

using Samples = std::vector<short>;
using Frames = std::vector<std::pair<int, int>>;

/// Makes a sound of these interleaved samples.
KvoSound SoundOf(const Samples& samples, int channels, long rate = 8000);

inline KvoSound MonoSound(const Samples& samples, long rate = 8000)
{
    return SoundOf(samples, 1, rate);
}

KvoSound StereoSound(const Frames& frames, long rate = 8000);

/// Makes a sound with a buffer whose channel count nobody supports.
KvoSound ThreeChannels();

/// Gives all the samples, as many as frames and channels say.
Samples SamplesOf(const KvoSound& sound);

/// Makes samples of every size, with runs of the extreme ones.
Samples RandomSamples(std::mt19937& random, std::size_t count);

/// Seconds as a time.
inline KvoTime Seconds(double seconds)
{
    return KvoTime::FromTicks(static_cast<int>(seconds * 6000));
}

/// A time that is this many frames at a rate.
inline KvoTime FrameTime(long frame, long rate = 8000)
{
    const long ticks = frame * 6000;
    // Up to the next tick, away from zero, so that it does not fall short.
    return KvoTime::FromTicks(static_cast<int>(
        ticks >= 0 ? (ticks + rate - 1) / rate : (ticks - rate + 1) / rate));
}

#endif
