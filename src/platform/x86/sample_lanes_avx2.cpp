#include "platform/x86/sample_lanes_avx2.h"

#if defined(__x86_64__) || defined(__i386__)

#include <bit>
#include <immintrin.h>

// Every operation does whole blocks and leaves the rest to the plain one.
// Loads and stores touch nothing outside what the plain one touches.

namespace zt_platform {

namespace {

constexpr std::size_t block = 16;  ///< Samples of a register.
constexpr std::size_t half = 8;    ///< Samples as numbers of a register.
constexpr std::int64_t stride = 8; ///< The same, for places.

[[gnu::target("avx2")]] __m256i load(const void* from)
{
    return _mm256_loadu_si256(static_cast<const __m256i*>(from));
}

[[gnu::target("avx2")]] __m128i load_half(const void* from)
{
    return _mm_loadu_si128(static_cast<const __m128i*>(from));
}

[[gnu::target("avx2")]] void store(void* to, __m256i value)
{
    _mm256_storeu_si256(static_cast<__m256i*>(to), value);
}

/// Gives 8 samples as floating-point numbers.
[[gnu::target("avx2")]] __m256 numbers_at(const short* samples)
{
    return _mm256_cvtepi32_ps(_mm256_cvtepi16_epi32(load_half(samples)));
}

/// Puts the low 16 bits of 16 numbers into one register, in order.
[[gnu::target("avx2")]] __m256i low_bits(__m256i first, __m256i last)
{
    const __m256i low = _mm256_set1_epi32(0xFFFF);
    return _mm256_permute4x64_epi64(
        _mm256_packus_epi32(_mm256_and_si256(first, low),
                            _mm256_and_si256(last, low)),
        0xD8);
}

[[gnu::target("avx2")]] __m256i weigh_half(const short* now,
                                           const short* before,
                                           __m256 now_factor,
                                           __m256 before_factor)
{
    return _mm256_add_epi32(
        _mm256_cvttps_epi32(_mm256_mul_ps(numbers_at(now), now_factor)),
        _mm256_cvttps_epi32(_mm256_mul_ps(numbers_at(before), before_factor)));
}

/// Averages 8 pairs: the sum, plus one if it is negative, halved downward.
[[gnu::target("avx2")]] __m256i average_half(const short* pairs)
{
    const __m256i sums = _mm256_madd_epi16(load(pairs), _mm256_set1_epi16(1));
    return _mm256_srai_epi32(
        _mm256_add_epi32(sums, _mm256_srli_epi32(sums, 31)), 1);
}

/// The sum of squares as a whole number of units in its last place.
struct Units
{
    std::int32_t count; ///< 2^23 to 2^24 - 1.
    int exponent;       ///< The unit is 2^(exponent - 23).
};

/// Requires: a normal number above 0.
Units units_of(float sum)
{
    const std::uint32_t bits = std::bit_cast<std::uint32_t>(sum);
    return {static_cast<std::int32_t>((bits & 0x7FFFFF) | 0x800000),
            static_cast<int>(bits >> 23) - 127};
}

float power_of_two(int exponent)
{
    return std::bit_cast<float>(static_cast<std::uint32_t>(exponent + 127)
                                << 23);
}

[[gnu::target("avx2")]] std::int32_t total_of(__m256i numbers)
{
    __m128i sum = _mm_add_epi32(_mm256_castsi256_si128(numbers),
                                _mm256_extracti128_si256(numbers, 1));
    sum = _mm_add_epi32(sum, _mm_unpackhi_epi64(sum, sum));
    sum = _mm_add_epi32(sum, _mm_shuffle_epi32(sum, 1));
    return _mm_cvtsi128_si32(sum);
}

/// Squares of samples that are added up as whole numbers.
///
/// While a sum in single precision keeps its exponent it is a whole number of
/// units, and adding a square adds that square rounded to a unit: the order
/// plays no part. Two things end this: a square half-way between two units,
/// whose rounding depends on the sum, and a sum that gets the next exponent.
struct Squares
{
    static constexpr std::size_t count = 32;

    bool are_plain;     ///< Whether no square is half-way or too large.
    std::int32_t total; ///< In units.
};

[[gnu::target("avx2")]] Squares squares_of(const short* samples,
                                           float square_scale)
{
    const __m256 scale = _mm256_set1_ps(square_scale);
    const __m256 tie = _mm256_set1_ps(0.5f);
    const __m256 largest = _mm256_set1_ps(16777216.0f);
    const __m256 no_sign = _mm256_castsi256_ps(_mm256_set1_epi32(0x7FFFFFFF));
    __m256i total = _mm256_setzero_si256();
    __m256 odd = _mm256_setzero_ps();
    for (std::size_t i = 0; i < Squares::count; i += half) {
        const __m256 value = numbers_at(samples + i);
        const __m256 square = _mm256_mul_ps(_mm256_mul_ps(value, value), scale);
        const __m256i units = _mm256_cvtps_epi32(square);
        const __m256 rest = _mm256_and_ps(
            _mm256_sub_ps(square, _mm256_cvtepi32_ps(units)), no_sign);
        odd = _mm256_or_ps(odd, _mm256_cmp_ps(rest, tie, _CMP_EQ_OQ));
        odd = _mm256_or_ps(odd, _mm256_cmp_ps(square, largest, _CMP_GE_OQ));
        total = _mm256_add_epi32(total, units);
    }
    return {_mm256_movemask_ps(odd) == 0, total_of(total)};
}

/// The places of 8 outputs one after the other.
struct Places
{
    __m256i index; ///< The whole parts.
    __m256i remainder;
};

/// Advances 8 places at a time.
class PlaceLanes
{
public:
    /// Tells whether places and steps fit the lanes.
    static bool can_do(const SampleLanes::Steps& steps)
    {
        constexpr std::int64_t largest = std::int64_t{1} << 30;
        return steps.grid < largest && steps.step / steps.grid < largest / 16;
    }

    [[gnu::target("avx2")]] explicit PlaceLanes(const SampleLanes::Steps& steps)
        : grid(_mm256_set1_epi32(static_cast<int>(steps.grid))),
          whole(_mm256_set1_epi32(
              static_cast<int>(stride * steps.step / steps.grid))),
          more(_mm256_set1_epi32(
              static_cast<int>(stride * steps.step % steps.grid)))
    {
        alignas(32) int index[half];
        alignas(32) int remainder[half];
        for (std::size_t i = 0; i < half; ++i) {
            const std::int64_t place =
                steps.rest + static_cast<std::int64_t>(i) * steps.step;
            index[i] = static_cast<int>(place / steps.grid);
            remainder[i] = static_cast<int>(place % steps.grid);
        }
        now.index = load(index);
        now.remainder = load(remainder);
    }

    const Places& places() const { return now; }

    [[gnu::target("avx2")]] int first_index() const
    {
        return _mm_cvtsi128_si32(_mm256_castsi256_si128(now.index));
    }

    [[gnu::target("avx2")]] void advance()
    {
        const __m256i sum = _mm256_add_epi32(now.remainder, more);
        // All ones, which is -1, where the remainder makes one more.
        const __m256i over =
            _mm256_cmpgt_epi32(sum, _mm256_sub_epi32(grid, one()));
        now.remainder = _mm256_sub_epi32(sum, _mm256_and_si256(over, grid));
        now.index = _mm256_sub_epi32(_mm256_add_epi32(now.index, whole), over);
    }

private:
    [[gnu::target("avx2")]] static __m256i one()
    {
        return _mm256_set1_epi32(1);
    }

    __m256i grid;
    __m256i whole; ///< Of 8 steps.
    __m256i more;
    Places now;
};

/// Gives what is left of the steps after some outputs, as numbers to go on
/// from with the plain lanes.
struct Rest
{
    std::size_t index;
    SampleLanes::Steps steps;
};

Rest after(const SampleLanes::Steps& steps, std::size_t outputs)
{
    const std::int64_t place =
        steps.rest + static_cast<std::int64_t>(outputs) * steps.step;
    return {static_cast<std::size_t>(place / steps.grid),
            {place % steps.grid, steps.step, steps.grid}};
}

/// Two neighbours for each of 8 outputs.
struct Neighbours
{
    __m256i here;
    __m256i next;
};

/// Reads neighbours that lie within 9 samples, as they do when there are more
/// outputs than samples.
[[gnu::target("avx2")]] Neighbours close_neighbours(const short* first,
                                                    __m256i offsets)
{
    // Places of bytes: each offset twice as low and high byte of a sample.
    const __m256i bytes =
        _mm256_add_epi32(_mm256_mullo_epi16(offsets, _mm256_set1_epi32(0x0202)),
                         _mm256_set1_epi32(0x0100));
    const __m128i choice = _mm_packus_epi32(_mm256_castsi256_si128(bytes),
                                            _mm256_extracti128_si256(bytes, 1));
    return {
        _mm256_cvtepi16_epi32(_mm_shuffle_epi8(load_half(first), choice)),
        _mm256_cvtepi16_epi32(_mm_shuffle_epi8(load_half(first + 1), choice))};
}

/// Reads neighbours wherever they are.
[[gnu::target("avx2")]] Neighbours far_neighbours(const short* samples,
                                                  __m256i index)
{
    const __m256i pairs = _mm256_i32gather_epi32(
        reinterpret_cast<const int*>(samples), index, sizeof(short));
    return {_mm256_srai_epi32(_mm256_slli_epi32(pairs, 16), 16),
            _mm256_srai_epi32(pairs, 16)};
}

[[gnu::target("avx2")]] __m256i between(const Neighbours& both,
                                        __m256i remainder, __m256 grid)
{
    const __m256 rise =
        _mm256_div_ps(_mm256_mul_ps(_mm256_cvtepi32_ps(
                                        _mm256_sub_epi32(both.next, both.here)),
                                    _mm256_cvtepi32_ps(remainder)),
                      grid);
    return _mm256_add_epi32(both.here, _mm256_cvttps_epi32(rise));
}

[[gnu::target("avx2")]] void store_low_bits(short* to, __m256i numbers)
{
    _mm_storeu_si128(reinterpret_cast<__m128i*>(to),
                     _mm256_castsi256_si128(low_bits(numbers, numbers)));
}

class Avx2SampleLanes final : public SampleLanes
{
public:
    const char* name() const override { return "avx2"; }

    [[gnu::target("avx2")]] void weigh(const short* now, const short* before,
                                       short* to, std::size_t count,
                                       float now_factor,
                                       float before_factor) const override
    {
        const __m256 of_now = _mm256_set1_ps(now_factor);
        const __m256 of_before = _mm256_set1_ps(before_factor);
        std::size_t left = count;
        while (left >= block) {
            const std::size_t at = left - block;
            const __m256i first =
                weigh_half(now + at, before + at, of_now, of_before);
            const __m256i last = weigh_half(now + at + half, before + at + half,
                                            of_now, of_before);
            store(to + at, low_bits(first, last));
            left = at;
        }
        SampleLanes::weigh(now, before, to, left, now_factor, before_factor);
    }

    [[gnu::target("avx2")]] void average(const short* pairs, short* averages,
                                         std::size_t count) const override
    {
        std::size_t at = 0;
        for (; at + block <= count; at += block)
            store(averages + at,
                  low_bits(average_half(pairs + 2 * at),
                           average_half(pairs + 2 * (at + half))));
        SampleLanes::average(pairs + 2 * at, averages + at, count - at);
    }

    [[gnu::target("avx2")]] Range range(const short* samples,
                                        std::size_t count) const override
    {
        if (count < 2 * block)
            return SampleLanes::range(samples, count);
        __m256i least[2] = {load(samples), load(samples + block)};
        __m256i largest[2] = {least[0], least[1]};
        std::size_t at = 2 * block;
        for (; at + 2 * block <= count; at += 2 * block)
            for (std::size_t i = 0; i < 2; ++i) {
                const __m256i here = load(samples + at + i * block);
                least[i] = _mm256_min_epi16(least[i], here);
                largest[i] = _mm256_max_epi16(largest[i], here);
            }
        const __m256i last = load(samples + count - block);
        const __m256i rest = load(samples + count - 2 * block);
        least[0] = _mm256_min_epi16(_mm256_min_epi16(least[0], least[1]),
                                    _mm256_min_epi16(last, rest));
        largest[0] = _mm256_max_epi16(_mm256_max_epi16(largest[0], largest[1]),
                                      _mm256_max_epi16(last, rest));
        short ends[2 * block];
        store(ends, least[0]);
        store(ends + block, largest[0]);
        return SampleLanes::range(ends, 2 * block);
    }

    [[gnu::target("avx2")]] float sum_of_squares(const short* samples,
                                                 std::size_t count,
                                                 float sum) const override
    {
        std::size_t at = 0;
        for (; at + Squares::count <= count; at += Squares::count) {
            const Units units = units_of(sum);
            const Squares squares = squares_of(
                samples + at, power_of_two(23 - 30 - units.exponent));
            if (sum > 0 && squares.are_plain &&
                units.count + squares.total < 1 << 24)
                sum = static_cast<float>(units.count + squares.total) *
                      power_of_two(units.exponent - 23);
            else
                sum = SampleLanes::sum_of_squares(samples + at, Squares::count,
                                                  sum);
        }
        return SampleLanes::sum_of_squares(samples + at, count - at, sum);
    }

    [[gnu::target("avx2")]] void interpolate(const short* samples, short* to,
                                             std::size_t count,
                                             const Steps& steps) const override
    {
        std::size_t at = 0;
        if (count >= half && PlaceLanes::can_do(steps)) {
            const __m256 grid = _mm256_set1_ps(static_cast<float>(steps.grid));
            const bool close = steps.step <= steps.grid;
            const int last = static_cast<int>(after(steps, count - 1).index);
            PlaceLanes lanes(steps);
            for (; at + half <= count; at += half, lanes.advance()) {
                // Close neighbours are read 9 samples at a time.
                if (close && lanes.first_index() + 8 > last + 1)
                    break;
                const Places& places = lanes.places();
                const int first = lanes.first_index();
                const Neighbours both =
                    close ? close_neighbours(
                                samples + first,
                                _mm256_sub_epi32(places.index,
                                                 _mm256_set1_epi32(first)))
                          : far_neighbours(samples, places.index);
                store_low_bits(to + at, between(both, places.remainder, grid));
            }
        }
        const Rest rest = after(steps, at);
        SampleLanes::interpolate(samples + rest.index, to + at, count - at,
                                 rest.steps);
    }

    [[gnu::target("avx2")]] void repeat(const short* frames, short* to,
                                        std::size_t count,
                                        const Steps& steps) const override
    {
        std::size_t at = 0;
        if (PlaceLanes::can_do(steps)) {
            PlaceLanes lanes(steps);
            for (; at + half <= count; at += half, lanes.advance())
                store(to + 2 * at,
                      _mm256_i32gather_epi32(
                          reinterpret_cast<const int*>(frames),
                          lanes.places().index, 2 * sizeof(short)));
        }
        const Rest rest = after(steps, at);
        SampleLanes::repeat(frames + 2 * rest.index, to + 2 * at, count - at,
                            rest.steps);
    }

    [[gnu::target("avx2")]] void to_big_bytes(const short* samples,
                                              unsigned char* bytes,
                                              std::size_t count) const override
    {
        std::size_t at = 0;
        for (; at + block <= count; at += block) {
            const __m256i here = load(samples + at);
            store(bytes + 2 * at, _mm256_or_si256(_mm256_slli_epi16(here, 8),
                                                  _mm256_srli_epi16(here, 8)));
        }
        SampleLanes::to_big_bytes(samples + at, bytes + 2 * at, count - at);
    }
};

constinit const Avx2SampleLanes avx2_lanes;

} // namespace

const SampleLanes* avx2_sample_lanes()
{
    __builtin_cpu_init(); // Static objects may ask before it was done.
    return __builtin_cpu_supports("avx2") ? &avx2_lanes : nullptr;
}

} // namespace zt_platform

#else

namespace zt_platform {

const SampleLanes* avx2_sample_lanes()
{
    return nullptr;
}

} // namespace zt_platform

#endif
