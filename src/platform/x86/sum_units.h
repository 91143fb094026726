#ifndef ZT_PLATFORM_X86_SUM_UNITS_H
#define ZT_PLATFORM_X86_SUM_UNITS_H

/// \file
/// A sum in single precision as a whole number.
///
/// While such a sum keeps its exponent it is a whole number of units in its
/// last place, and adding something adds that rounded to a unit: the order
/// plays no part, so many can be added at once. Two things end this: what lies
/// half-way between two units, whose rounding depends on the sum, and a sum
/// that gets the next exponent.

#include <bit>
#include <cstdint>

namespace zt_platform {

class SumUnits
{
public:
    /// From this sum on no square of a sample is 2^24 units or more.
    static constexpr float least_sum = 1;

    /// Requires: a sum of `least_sum` or more.
    explicit SumUnits(float sum)
    {
        const std::uint32_t bits = std::bit_cast<std::uint32_t>(sum);
        count = static_cast<std::int32_t>((bits & 0x7FFFFF) | 0x800000);
        exponent = static_cast<int>(bits >> last_bit) - bias;
    }

    /// Gives what the square of a sample is multiplied by to count units, each
    /// sample being divided by 2^15.
    float square_scale() const
    {
        return power_of_two(last_bit - 30 - exponent);
    }

    /// Adds some units.
    ///
    /// Returns: false, with nothing added, if the exponent would change.
    bool add(std::int32_t units)
    {
        if (count + units >= 1 << (last_bit + 1))
            return false;
        count += units;
        return true;
    }

    float sum() const
    {
        return static_cast<float>(count) * power_of_two(exponent - last_bit);
    }

private:
    static constexpr int last_bit = 23;
    static constexpr int bias = 127;

    static float power_of_two(int power)
    {
        return std::bit_cast<float>(static_cast<std::uint32_t>(power + bias)
                                    << last_bit);
    }

    std::int32_t count;
    int exponent;
};

} // namespace zt_platform

#endif
