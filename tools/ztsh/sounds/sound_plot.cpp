#include "sounds/sound_plot.h"

#include <algorithm>
#include <cmath>
#include <numbers>
#include <vector>

namespace ztsh {

namespace {

constexpr ZtPixel line_colour = 0x40C060FF;
constexpr ZtPixel axis_colour = 0x404040FF;
constexpr long sample_values = 65536;

/// Draws a column from row `low` to row `high`, as far as the picture goes.
void draw_column(ZtImageSGI& picture, int x, long low, long high,
                 ZtPixel colour)
{
    const long first = std::max(low, 0L);
    const long last = std::min<long>(high, picture.height - 1);
    for (long y = first; y <= last; ++y)
        picture.pixels[y * picture.width + x] = colour;
}

/// The rows that a channel has in a picture.
struct Lane
{
    long bottom;
    long height;

    long Row(short sample) const
    {
        return bottom + (sample + sample_values / 2) * (height - 1) /
                            (sample_values - 1);
    }
};

void draw_channel(const KvoSound& sound, int channel, const Lane& lane,
                  ZtImageSGI& picture)
{
    const long step = sound.channels;
    for (int x = 0; x < picture.width; ++x) {
        const long from = sound.frames * x / picture.width;
        const long to =
            std::max(sound.frames * (x + 1) / picture.width, from + 1);
        short least = sound.samples[from * step + channel];
        short largest = least;
        for (long frame = from; frame < to; ++frame) {
            const short sample = sound.samples[frame * step + channel];
            least = std::min(least, sample);
            largest = std::max(largest, sample);
        }
        draw_column(picture, x, lane.Row(0), lane.Row(0), axis_colour);
        draw_column(picture, x, lane.Row(least), lane.Row(largest),
                    line_colour);
    }
}

/// Some frames of a sound, both channels as one, weighed so that they begin
/// and end in silence.
std::vector<double> window_at(const KvoSound& sound, long first, long count)
{
    std::vector<double> window;
    for (long i = 0; i < count; ++i) {
        double value = 0;
        for (int channel = 0; channel < sound.channels; ++channel)
            value += sound.samples[(first + i) * sound.channels + channel];
        const double weight =
            0.5 - 0.5 * std::cos(2 * std::numbers::pi *
                                 (static_cast<double>(i) + 0.5) /
                                 static_cast<double>(count));
        window.push_back(value / sound.channels / 32768 * weight);
    }
    return window;
}

/// Gives the power of one frequency, a full sine being 1, by running a
/// resonator of that frequency over the samples.
///
/// Units: `cycles` in cycles a sample, 0 to 0.5.
double power_at(const std::vector<double>& window, double cycles)
{
    const double twice = 2 * std::cos(2 * std::numbers::pi * cycles);
    double last = 0;
    double before_last = 0;
    for (double sample : window) {
        const double now = sample + twice * last - before_last;
        before_last = last;
        last = now;
    }
    const double power =
        last * last + before_last * before_last - twice * last * before_last;
    const double full = static_cast<double>(window.size()) / 4;
    return power / (full * full);
}

} // namespace

void DrawWaveform(const KvoSound& sound, ZtImageSGI& picture)
{
    const long height = picture.height / sound.channels;
    for (int channel = 0; channel < sound.channels; ++channel)
        draw_channel(sound, channel,
                     {height * (sound.channels - 1 - channel), height},
                     picture);
}

void DrawSpectrum(const KvoSound& sound, ZtImageSGI& picture)
{
    constexpr long most_frames = 2048;
    constexpr long most_windows = 8;
    constexpr double floor = -96;
    const long count = std::min(sound.frames, most_frames);
    const long windows = std::min(sound.frames / count, most_windows);
    // So many frequencies that none falls between two of them.
    const int in_column = static_cast<int>(count / 2 / picture.width + 1);
    std::vector<double> power(
        static_cast<std::size_t>(picture.width * in_column), 0.0);
    for (long i = 0; i < windows; ++i) {
        const long first =
            windows > 1 ? (sound.frames - count) * i / (windows - 1) : 0;
        const std::vector<double> window = window_at(sound, first, count);
        for (std::size_t k = 0; k < power.size(); ++k)
            power[k] += power_at(window, 0.5 * (static_cast<double>(k) + 0.5) /
                                             static_cast<double>(power.size()));
    }
    for (int x = 0; x < picture.width; ++x) {
        const auto from =
            power.begin() + static_cast<std::ptrdiff_t>(x) * in_column;
        const double loudest = *std::max_element(from, from + in_column) /
                               static_cast<double>(windows);
        const double decibels = 10 * std::log10(std::max(loudest, 1e-20));
        const double share = std::clamp(1 - decibels / floor, 0.0, 1.0);
        draw_column(picture, x, 0,
                    static_cast<long>(share * picture.height) - 1, line_colour);
    }
}

} // namespace ztsh
