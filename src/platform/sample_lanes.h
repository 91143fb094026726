#ifndef ZT_PLATFORM_SAMPLE_LANES_H
#define ZT_PLATFORM_SAMPLE_LANES_H

/// \file
/// Work on 16-bit samples that a processor can do for many at a time.
///
/// The class itself does one sample after the other, on any processor, and is
/// what everything else is held to: a derived class does the same in wider
/// steps and gives the same bits. Which one is in use is decided once, by what
/// the processor can do.

#include <cstddef>
#include <cstdint>

namespace zt_platform {

class SampleLanes
{
public:
    /// Gives a name for tests and measurements.
    virtual const char* name() const;

    /// Makes to[i] the low 16 bits of trunc(now[i] * now_factor) +
    /// trunc(before[i] * before_factor), in single precision, from the last
    /// one down to the first: `to` may be `now` while `before` is what stands
    /// ahead of it in memory.
    ///
    /// Requires: factors of at most `largest_factor` either way.
    static constexpr float largest_factor = 32768.0f;
    virtual void weigh(const short* now, const short* before, short* to,
                       std::size_t count, float now_factor,
                       float before_factor) const;

    /// Averages pairs of samples, rounding toward zero.
    virtual void average(const short* pairs, short* averages,
                         std::size_t count) const;

    /// The smallest and the largest of some samples.
    struct Range
    {
        short least;
        short largest;
    };

    /// Requires: at least one sample.
    virtual Range range(const short* samples, std::size_t count) const;

    /// Adds the squares of the samples, each divided by 32768, to `sum`, one
    /// after the other in single precision.
    ///
    /// Requires: `sum` is 0 to 2^60.
    virtual float sum_of_squares(const short* samples, std::size_t count,
                                 float sum) const;

    /// How to step through samples: output number k stands at
    /// (rest + k * step) / grid, in samples.
    ///
    /// Units: grid 1 to 2^31 - 1, step likewise, rest 0 to grid - 1.
    struct Steps
    {
        std::int64_t rest;
        std::int64_t step;
        std::int64_t grid;
    };

    /// Makes `count` samples on straight lines between `samples`: with j the
    /// whole part and r the remainder of an output's place, s[j] +
    /// trunc((s[j + 1] - s[j]) * r / grid), in single precision.
    ///
    /// Requires: samples as far as the one behind the last place; places below
    ///           2^30.
    virtual void interpolate(const short* samples, short* to, std::size_t count,
                             const Steps& steps) const;

    /// Makes `count` frames of two samples, each the one at the whole part of
    /// its place.
    ///
    /// Requires: frames as far as the last place; places below 2^30.
    virtual void repeat(const short* frames, short* to, std::size_t count,
                        const Steps& steps) const;

    /// Writes samples as pairs of bytes, the most significant first.
    virtual void to_big_bytes(const short* samples, unsigned char* bytes,
                              std::size_t count) const;

    /// Gives what is in use: the fastest that this processor can do, or what a
    /// test installed.
    static const SampleLanes& current();

    /// Installs others; null restores the fastest.
    ///
    /// Owner: the caller, who installs others before destroying them.
    static void install(const SampleLanes* other);

    /// Gives those that do one sample after the other.
    static const SampleLanes& plain();

    /// Gives the fastest that this processor can do.
    static const SampleLanes& fastest();

    /// Gives the plain ones for number 0, and for each further number faster
    /// ones.
    ///
    /// Returns: null for more than this processor can do.
    static const SampleLanes* numbered(std::size_t number);

protected:
    ~SampleLanes() = default;
};

} // namespace zt_platform

#endif
