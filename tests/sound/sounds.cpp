#include "sound/sounds.h"

#include <algorithm>

KvoSound SoundOf(const Samples& samples, int channels, long rate)
{
    short* buffer = nullptr;
    if (!samples.empty()) {
        buffer = new short[samples.size()];
        std::copy(samples.begin(), samples.end(), buffer);
    }
    return KvoSound(rate, channels,
                    static_cast<long>(samples.size()) / channels, buffer);
}

KvoSound StereoSound(const Frames& frames, long rate)
{
    Samples samples;
    for (auto [left, right] : frames) {
        samples.push_back(static_cast<short>(left));
        samples.push_back(static_cast<short>(right));
    }
    return SoundOf(samples, 2, rate);
}

KvoSound ThreeChannels()
{
    // Six samples are two frames of three, and three of two.
    KvoSound sound = SoundOf({1, 2, 3, 4, 5, 6}, 2);
    sound.channels = 3;
    sound.frames = 2;
    return sound;
}

Samples SamplesOf(const KvoSound& sound)
{
    if (!sound.samples)
        return {};
    return Samples(sound.samples,
                   sound.samples + sound.frames * sound.channels);
}

Samples RandomSamples(std::mt19937& random, std::size_t count)
{
    Samples samples(count);
    std::size_t at = 0;
    while (at < count) {
        const std::size_t end =
            std::min<std::size_t>(count, at + 1 + random() % 40);
        const auto kind = random() % 5;
        const auto shift = random() % 16;
        for (; at < end; ++at) {
            const auto word = static_cast<short>(random());
            samples[at] = kind == 0   ? short{-32768}
                          : kind == 1 ? short{32767}
                          : kind == 2 ? short{0}
                                      : static_cast<short>(word >> shift);
        }
    }
    return samples;
}
