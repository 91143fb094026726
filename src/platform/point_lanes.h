#ifndef ZT_PLATFORM_POINT_LANES_H
#define ZT_PLATFORM_POINT_LANES_H

/// \file
/// Work on arrays of points that a processor can do for several at a time.
///
/// The class itself works on any processor and is what everything else is held
/// to: a derived class does the same in wider steps and gives the same bits.
/// Which one is in use is decided once, by what the processor can do.

#include <cstddef>

namespace zt_platform {

class PointLanes
{
public:
    /// Gives a name for tests and measurements.
    virtual const char* name() const;

    /// Multiplies row vectors of four floats by a matrix of 16, given row by
    /// row, each sum from left to right. Unless the last element of a product
    /// is exactly 0 or 1, the others are divided by it and it becomes 1.
    ///
    /// Requires: `points` and `products` hold four floats for each of `count`,
    ///           and are the same or do not overlap.
    virtual void transform(const float* points, float* products,
                           std::size_t count, const float* matrix) const;

    /// Does the same to points of three floats, each with a 1 behind it, and
    /// drops the last element of the products.
    ///
    /// Requires: as above, with three floats for each.
    virtual void transform3(const float* points, float* products,
                            std::size_t count, const float* matrix) const;

    /// Gives what is in use: the fastest that this processor can do, or what a
    /// test installed.
    static const PointLanes& current();

    /// Installs others; null restores the fastest.
    ///
    /// Owner: the caller, who installs others before destroying them.
    static void install(const PointLanes* other);

    /// Gives those that do one point after the other.
    static const PointLanes& plain();

    /// Gives the fastest that this processor can do.
    static const PointLanes& fastest();

    /// So many points of four floats fill a line of the cache.
    static constexpr std::size_t points_in_line = 4;
    static constexpr std::size_t floats_in_line = 16;

    /// So far ahead of the float in hand memory is asked for the ones to come.
    /// Without it an array larger than the cache takes twice as long.
    static constexpr std::size_t floats_ahead = 32 * floats_in_line;

protected:
    ~PointLanes() = default;

    /// Asks for the line that will be needed later on, if there is one; `at`
    /// and `count` are floats. Always inline, since the compiler takes it for a
    /// function without effect and drops its calls.
    [[gnu::always_inline]] static void fetch_ahead(const float* points,
                                                   const float* products,
                                                   std::size_t at,
                                                   std::size_t count)
    {
        if (count - at > floats_ahead) {
            __builtin_prefetch(points + at + floats_ahead, 0);
            __builtin_prefetch(products + at + floats_ahead, 1);
        }
    }
};

} // namespace zt_platform

#endif
