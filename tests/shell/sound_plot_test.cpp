#include "sounds/sound_plot.h"

#include <algorithm>
#include <cmath>
#include <functional>
#include <vector>

#include <gtest/gtest.h>

namespace ztsh {

namespace {

constexpr ZtPixel black = 0x000000FF;

/// A sound of these many frames, each sample made from channel and frame.
KvoSound Made(int channels, long frames,
              const std::function<double(int, long)>& sample)
{
    auto* const samples =
        new short[static_cast<std::size_t>(channels * frames)];
    for (long frame = 0; frame < frames; ++frame)
        for (int channel = 0; channel < channels; ++channel)
            samples[frame * channels + channel] =
                static_cast<short>(std::lround(sample(channel, frame)));
    return KvoSound(8000, channels, frames, samples);
}

KvoSound Sine(double hertz, long frames)
{
    return Made(1, frames, [&](int, long frame) {
        return 32767 *
               std::sin(2 * M_PI * hertz * static_cast<double>(frame) / 8000);
    });
}

class Drawn
{
public:
    Drawn(int width, int height) : image(width, height, nullptr)
    {
        std::fill_n(image.pixels, static_cast<long>(width) * height, black);
    }

    /// Gives the rows of a column that are brighter than an axis.
    std::vector<int> Rows(int column) const
    {
        std::vector<int> rows;
        for (int row = 0; row < image.height; ++row)
            if ((image.pixels[row * image.width + column] >> 16 & 0xFF) > 0x40)
                rows.push_back(row);
        return rows;
    }

    ZtImageSGI image;
};

} // namespace

TEST(Waveform, DrawsFromTheLowestToTheHighestSampleOfEachColumn)
{
    // One column rises over the whole range, the next one stands at the top.
    const KvoSound sound = Made(1, 200, [](int, long frame) {
        return frame < 100 ? -32768 + 655.35 * static_cast<double>(frame) + 655
                           : 32767;
    });
    Drawn drawn(2, 101);

    DrawWaveform(sound, drawn.image);

    EXPECT_GE(drawn.Rows(0).size(), 99U);
    EXPECT_EQ(drawn.Rows(1), std::vector<int>{100});
}

TEST(Waveform, DrawsSilenceAsALineInTheMiddle)
{
    const KvoSound sound = Made(1, 10, [](int, long) { return 0; });
    Drawn drawn(3, 9);

    DrawWaveform(sound, drawn.image);

    for (int column = 0; column < 3; ++column)
        EXPECT_EQ(drawn.Rows(column), std::vector<int>{4});
}

TEST(Waveform, DrawsTheLeftChannelAboveTheRightOne)
{
    const KvoSound sound = Made(
        2, 10, [](int channel, long) { return channel == 0 ? 32767 : -32768; });
    Drawn drawn(1, 20);

    DrawWaveform(sound, drawn.image);

    EXPECT_EQ(drawn.Rows(0), (std::vector<int>{0, 19}));
}

TEST(Waveform, DrawsASoundOfFewerFramesThanColumns)
{
    const KvoSound sound = Made(1, 1, [](int, long) { return 32767; });
    Drawn drawn(50, 10);

    DrawWaveform(sound, drawn.image);

    for (int column = 0; column < 50; ++column)
        EXPECT_EQ(drawn.Rows(column), std::vector<int>{9});
}

TEST(Spectrum, ShowsAFullSineAtItsFrequencyUpToTheTop)
{
    Drawn drawn(400, 96);

    DrawSpectrum(Sine(1005, 8000), drawn.image);

    // Half the rate is 4000 hz: a column is 10 hz, a row a decibel.
    const std::size_t peak = drawn.Rows(100).size();
    EXPECT_GE(peak, 90U);
    EXPECT_LT(drawn.Rows(300).size(), 40U);
    for (const int column : {0, 50, 150, 399})
        EXPECT_LT(drawn.Rows(column).size(), peak / 2) << column;
}

TEST(Spectrum, OfFewColumnsShowsWhatFallsBetweenTheirMiddles)
{
    for (const long frames : {300L, 2048L, 20000L}) {
        Drawn drawn(11, 96);

        DrawSpectrum(Sine(1000, frames), drawn.image);

        // 1000 of 4000 hz lie in column 2 of 0 to 10.
        EXPECT_GE(drawn.Rows(2).size(), 94U) << frames;
        EXPECT_LE(drawn.Rows(8).size(), 48U) << frames;
    }
}

TEST(Spectrum, OfSilenceIsEmpty)
{
    Drawn drawn(10, 10);

    DrawSpectrum(Made(2, 100, [](int, long) { return 0; }), drawn.image);

    for (int column = 0; column < 10; ++column)
        EXPECT_TRUE(drawn.Rows(column).empty());
}

TEST(Spectrum, OfOneFrameStaysInsideThePicture)
{
    Drawn drawn(10, 10);

    DrawSpectrum(Made(1, 1, [](int, long) { return 32767; }), drawn.image);

    EXPECT_LE(drawn.Rows(0).size(), 10U);
}

} // namespace ztsh
