#ifndef ZT_TESTS_SOUND_LITERAL_H
#define ZT_TESTS_SOUND_LITERAL_H

/// \file
/// The operations on sounds written down as they are described, one sample
/// after the other, with no care for speed: what the library has to agree with
/// bit for bit.

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <numeric>
#include <vector>

namespace literal {

using Samples = std::vector<short>;

/// Truncates, with the ends of 32 bits for what lies beyond.
inline std::int64_t Truncated(float value)
{
    if (std::isnan(value))
        return 0;
    if (value >= 2147483648.0f)
        return 2147483647;
    if (value <= -2147483648.0f)
        return -2147483648LL;
    return static_cast<std::int64_t>(value);
}

inline short Low(std::int64_t value)
{
    return static_cast<short>(static_cast<std::uint64_t>(value));
}

inline float LowPassWeight(long frequency, long rate)
{
    return static_cast<float>(2.0 * 3.14159265358979323846 *
                              static_cast<double>(frequency) /
                              static_cast<double>(rate));
}

inline float LowPassDecay(long frequency, long rate)
{
    const float w = LowPassWeight(frequency, rate);
    return static_cast<float>(
        std::exp(-static_cast<double>(w) / static_cast<double>(rate)));
}

inline void Weigh(Samples& x, std::size_t channels, std::size_t first, float w,
                  float g)
{
    for (std::size_t i = x.size(); i-- > first * channels;)
        x[i] = Low(Truncated(static_cast<float>(x[i]) * w) +
                   Truncated(static_cast<float>(x[i - channels]) * g));
}

inline void LoPass(Samples& x, std::size_t channels, long frequency, long rate)
{
    Weigh(x, channels, 1, LowPassWeight(frequency, rate),
          LowPassDecay(frequency, rate));
}

inline void PreEmphasis(Samples& x, std::size_t channels, float a)
{
    for (std::size_t i = x.size(); i-- > 2 * channels;)
        x[i] = Low(x[i] - Truncated(a * static_cast<float>(x[i - channels])));
}

inline Samples Resample(Samples x, std::size_t channels, long rate,
                        long new_rate)
{
    const std::int64_t grid = std::lcm(rate, new_rate);
    const std::int64_t up = grid / rate;
    const std::int64_t down = grid / new_rate;
    LoPass(x, channels, new_rate / 2, rate);
    const auto frames = static_cast<std::int64_t>(x.size() / channels);
    const std::int64_t count = frames * up / down;
    Samples out;
    for (std::int64_t k = 0; k < count; ++k) {
        const auto j = static_cast<std::size_t>(k * down / up);
        if (channels == 2) {
            out.push_back(x[2 * j]);
            out.push_back(x[2 * j + 1]);
            continue;
        }
        const std::size_t next = std::min(j + 1, x.size() - 1);
        const float rise =
            static_cast<float>(x[next] - x[j]) *
            static_cast<float>(k * down - static_cast<std::int64_t>(j) * up) /
            static_cast<float>(up);
        out.push_back(Low(x[j] + Truncated(rise)));
    }
    return out;
}

inline Samples Mono(const Samples& x)
{
    Samples out;
    for (std::size_t i = 0; i + 1 < x.size(); i += 2)
        out.push_back(static_cast<short>((x[i] + x[i + 1]) / 2));
    return out;
}

inline float Volume(const Samples& x)
{
    float sum = 0;
    for (short sample : x) {
        const float value = static_cast<float>(sample) / 32768.0f;
        sum += value * value;
    }
    return x.empty() ? 0 : std::sqrt(sum / static_cast<float>(x.size()));
}

/// The smallest and the largest sample, as they are kept.
struct Range
{
    float min;
    float max;
};

inline Range MinMax(const Samples& x)
{
    Range range = {x.empty() ? 0.0f : static_cast<float>(x[0]),
                   x.empty() ? 0.0f : static_cast<float>(x[0])};
    for (short sample : x) {
        if (static_cast<float>(sample) < range.min)
            range.min = static_cast<float>(sample);
        if (static_cast<float>(sample) > range.max)
            range.max = static_cast<float>(sample);
    }
    return range;
}

/// The entries of a window, the last one zero unless it is written.
inline std::vector<float> Window(int type, std::size_t count)
{
    std::vector<float> table(count, 0.0f);
    if (type == 3) {
        for (std::size_t i = 0; i <= count / 2 && i < count; ++i) {
            const float entry =
                static_cast<float>(i) / static_cast<float>(count / 2);
            table[i] = entry;
            table[count - 1 - i] = entry;
        }
        return table;
    }
    for (std::size_t i = 0; i + 1 < count; ++i) {
        const float x = (6.2831853f * static_cast<float>(i)) /
                        static_cast<float>(count - 1);
        const float c = std::cos(x);
        table[i] = type == 1   ? 0.54f - 0.46f * c
                   : type == 2 ? (1.0f - c) * 0.5f
                               : 0.42f - 0.5f * c + 0.08f * c;
    }
    return table;
}

} // namespace literal

#endif
