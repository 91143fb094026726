#include "platform/x86/sample_lanes_avx2.h"

#if defined(__x86_64__) || defined(__i386__)

#include "platform/x86/processor.h"
#include "platform/x86/sum_units.h"

#include <algorithm>
#include <immintrin.h>
#include <numeric>

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

[[gnu::target("avx2")]] std::int32_t total_of(__m256i numbers)
{
    __m128i sum = _mm_add_epi32(_mm256_castsi256_si128(numbers),
                                _mm256_extracti128_si256(numbers, 1));
    sum = _mm_add_epi32(sum, _mm_unpackhi_epi64(sum, sum));
    sum = _mm_add_epi32(sum, _mm_shuffle_epi32(sum, 1));
    return _mm_cvtsi128_si32(sum);
}

/// Squares of samples, rounded to units of a sum.
struct Squares
{
    static constexpr std::size_t count = 64;

    bool has_tie;       ///< Whether a square is half-way.
    std::int32_t total; ///< In units.
};

/// Requires: squares of less than 2^24 units.
[[gnu::target("avx2")]] Squares squares_of(const short* samples, __m256 scale)
{
    const __m256 half_unit = _mm256_set1_ps(0.5f);
    const __m256 no_sign = _mm256_castsi256_ps(_mm256_set1_epi32(0x7FFFFFFF));
    __m256i total = _mm256_setzero_si256();
    __m256 ties = _mm256_setzero_ps();
    for (std::size_t i = 0; i < Squares::count; i += half) {
        const __m256 value = numbers_at(samples + i);
        const __m256 square = _mm256_mul_ps(_mm256_mul_ps(value, value), scale);
        const __m256i units = _mm256_cvtps_epi32(square);
        const __m256 rest = _mm256_and_ps(
            _mm256_sub_ps(square, _mm256_cvtepi32_ps(units)), no_sign);
        ties = _mm256_or_ps(ties, _mm256_cmp_ps(rest, half_unit, _CMP_EQ_OQ));
        total = _mm256_add_epi32(total, units);
    }
    return {_mm256_movemask_ps(ties) != 0, total_of(total)};
}

/// Adds up squares as long as the sum keeps its exponent and no square is
/// half-way between two units.
///
/// Returns: how many samples were taken, whole blocks of them.
[[gnu::target("avx2")]] std::size_t
add_plain_squares(const short* samples, std::size_t count, float& sum)
{
    SumUnits units(sum);
    const __m256 scale = _mm256_set1_ps(units.square_scale());
    std::size_t at = 0;
    for (; at + Squares::count <= count; at += Squares::count) {
        const Squares squares = squares_of(samples + at, scale);
        if (squares.has_tie || !units.add(squares.total))
            break;
    }
    sum = units.sum();
    return at;
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

[[gnu::target("avx2")]] void store_low_bits(short* to, __m256i numbers)
{
    _mm_storeu_si128(reinterpret_cast<__m128i*>(to),
                     _mm256_castsi256_si128(low_bits(numbers, numbers)));
}

/// Two neighbours for each of 8 outputs, wherever they are.
struct Neighbours
{
    __m256i here;
    __m256i next;
};

[[gnu::target("avx2")]] Neighbours neighbours_at(const short* samples,
                                                 __m256i index)
{
    const __m256i pairs = _mm256_i32gather_epi32(
        reinterpret_cast<const int*>(samples), index, sizeof(short));
    return {_mm256_srai_epi32(_mm256_slli_epi32(pairs, 16), 16),
            _mm256_srai_epi32(pairs, 16)};
}

[[gnu::target("avx2")]] __m256i rise_between(__m256i here, __m256i next,
                                             __m256 remainder, __m256 grid)
{
    const __m256 difference = _mm256_cvtepi32_ps(_mm256_sub_epi32(next, here));
    return _mm256_cvttps_epi32(
        _mm256_div_ps(_mm256_mul_ps(difference, remainder), grid));
}

/// Where 8 outputs lie that are no farther apart than samples: from a first
/// one, and within the 8 from there on.
struct Block
{
    __m256i offsets; ///< From the first one.
    __m256 remainders;
    __m128i choice; ///< The offsets as pairs of bytes, to shuffle by.
    std::ptrdiff_t first;
};

/// The blocks of a run of steps that begins anew when grid and blocks meet.
class Period
{
public:
    /// Tells whether steps are short and repeat soon enough.
    static bool can_do(const SampleLanes::Steps& steps)
    {
        return PlaceLanes::can_do(steps) && steps.step <= steps.grid &&
               blocks_of(steps) <= static_cast<std::int64_t>(most_blocks);
    }

    /// Makes the blocks that `outputs` need.
    [[gnu::target("avx2")]] Period(const SampleLanes::Steps& steps,
                                   std::size_t outputs)
        : period(blocks_of(steps) * stride * steps.step / steps.grid),
          block_count(static_cast<std::size_t>(blocks_of(steps)))
    {
        PlaceLanes lanes(steps);
        const std::size_t needed = std::min(block_count, outputs / half);
        for (std::size_t i = 0; i < needed; ++i, lanes.advance()) {
            const int first = lanes.first_index();
            blocks[i].first = first;
            blocks[i].offsets = _mm256_sub_epi32(lanes.places().index,
                                                 _mm256_set1_epi32(first));
            blocks[i].choice = bytes_of(blocks[i].offsets);
            blocks[i].remainders = _mm256_cvtepi32_ps(lanes.places().remainder);
        }
    }

    /// A block after the other. It is kept apart from the blocks so that it
    /// can stay in registers while outputs are stored.
    class Cursor
    {
    public:
        explicit Cursor(const Period& whole_period)
            : period(whole_period.period), begin(whole_period.blocks),
              end(begin + whole_period.block_count), now(begin), start(0)
        {}

        const Block& block() const { return *now; }

        /// Gives the first sample of the block.
        std::ptrdiff_t first() const { return start + now->first; }

        void advance()
        {
            if (++now == end) {
                now = begin;
                start += period;
            }
        }

    private:
        std::ptrdiff_t period;
        const Block* begin;
        const Block* end;
        const Block* now;
        std::ptrdiff_t start; ///< Of the run.
    };

private:
    static constexpr std::size_t most_blocks = 512;

    static std::int64_t blocks_of(const SampleLanes::Steps& steps)
    {
        return steps.grid / std::gcd(steps.grid, stride);
    }

    /// Gives the places of the bytes of samples.
    [[gnu::target("avx2")]] static __m128i bytes_of(__m256i offsets)
    {
        const __m256i bytes = _mm256_add_epi32(
            _mm256_mullo_epi16(offsets, _mm256_set1_epi32(0x0202)),
            _mm256_set1_epi32(0x0100));
        return _mm_packus_epi32(_mm256_castsi256_si128(bytes),
                                _mm256_extracti128_si256(bytes, 1));
    }

    std::ptrdiff_t period; ///< Samples from one run to the next.
    std::size_t block_count;
    Block blocks[most_blocks];
};

/// Makes outputs that lie close together, by shuffling what a block has.
///
/// Returns: how many were made.
[[gnu::target("avx2")]] std::size_t
interpolate_close(const short* samples, short* to, std::size_t count,
                  const SampleLanes::Steps& steps, std::ptrdiff_t last)
{
    const __m256 grid = _mm256_set1_ps(static_cast<float>(steps.grid));
    const __m128i low = _mm_set1_epi32(0xFFFF);
    const Period period(steps, count);
    Period::Cursor cursor(period);
    std::size_t at = 0;
    // A block reads 9 samples, the last place has one behind it.
    for (; at + half <= count && cursor.first() + 8 <= last + 1;
         at += half, cursor.advance()) {
        const Block& places = cursor.block();
        const short* from = samples + cursor.first();
        const __m128i here = _mm_shuffle_epi8(load_half(from), places.choice);
        const __m128i next =
            _mm_shuffle_epi8(load_half(from + 1), places.choice);
        const __m256i rise =
            rise_between(_mm256_cvtepi16_epi32(here),
                         _mm256_cvtepi16_epi32(next), places.remainders, grid);
        const __m128i rise_bits = _mm_packus_epi32(
            _mm_and_si128(_mm256_castsi256_si128(rise), low),
            _mm_and_si128(_mm256_extracti128_si256(rise, 1), low));
        _mm_storeu_si128(reinterpret_cast<__m128i*>(to + at),
                         _mm_add_epi16(here, rise_bits));
    }
    return at;
}

/// Makes frames that lie close together likewise.
[[gnu::target("avx2")]] std::size_t
repeat_close(const short* frames, short* to, std::size_t count,
             const SampleLanes::Steps& steps, std::ptrdiff_t last)
{
    const Period period(steps, count);
    Period::Cursor cursor(period);
    std::size_t at = 0;
    for (; at + half <= count && cursor.first() + 7 <= last;
         at += half, cursor.advance())
        store(to + 2 * at,
              _mm256_permutevar8x32_epi32(load(frames + 2 * cursor.first()),
                                          cursor.block().offsets));
    return at;
}

/// Makes outputs that lie anywhere, by fetching each.
[[gnu::target("avx2")]] std::size_t
interpolate_anywhere(const short* samples, short* to, std::size_t count,
                     const SampleLanes::Steps& steps)
{
    const __m256 grid = _mm256_set1_ps(static_cast<float>(steps.grid));
    PlaceLanes lanes(steps);
    std::size_t at = 0;
    for (; at + half <= count; at += half, lanes.advance()) {
        const Neighbours both = neighbours_at(samples, lanes.places().index);
        const __m256i rise =
            rise_between(both.here, both.next,
                         _mm256_cvtepi32_ps(lanes.places().remainder), grid);
        store_low_bits(to + at, _mm256_add_epi32(both.here, rise));
    }
    return at;
}

[[gnu::target("avx2")]] std::size_t
repeat_anywhere(const short* frames, short* to, std::size_t count,
                const SampleLanes::Steps& steps)
{
    PlaceLanes lanes(steps);
    std::size_t at = 0;
    for (; at + half <= count; at += half, lanes.advance())
        store(to + 2 * at,
              _mm256_i32gather_epi32(reinterpret_cast<const int*>(frames),
                                     lanes.places().index, 2 * sizeof(short)));
    return at;
}

/// Gives the whole part of the last place.
std::ptrdiff_t last_place(const SampleLanes::Steps& steps, std::size_t count)
{
    return static_cast<std::ptrdiff_t>(after(steps, count - 1).index);
}

struct InstalledLanes final : Avx2SampleLanes
{};

constinit const InstalledLanes avx2_lanes;

} // namespace

const char* Avx2SampleLanes::name() const
{
    return "avx2";
}

[[gnu::target("avx2")]] void
Avx2SampleLanes::weigh(const short* now, const short* before, short* to,
                       std::size_t count, float now_factor,
                       float before_factor) const
{
    const __m256 of_now = _mm256_set1_ps(now_factor);
    const __m256 of_before = _mm256_set1_ps(before_factor);
    std::size_t left = count;
    while (left >= block) {
        const std::size_t at = left - block;
        const __m256i first =
            weigh_half(now + at, before + at, of_now, of_before);
        const __m256i last =
            weigh_half(now + at + half, before + at + half, of_now, of_before);
        store(to + at, low_bits(first, last));
        left = at;
    }
    SampleLanes::weigh(now, before, to, left, now_factor, before_factor);
}

[[gnu::target("avx2")]] void Avx2SampleLanes::average(const short* pairs,
                                                      short* averages,
                                                      std::size_t count) const
{
    std::size_t at = 0;
    for (; at + block <= count; at += block)
        store(averages + at, low_bits(average_half(pairs + 2 * at),
                                      average_half(pairs + 2 * (at + half))));
    SampleLanes::average(pairs + 2 * at, averages + at, count - at);
}

[[gnu::target("avx2")]] SampleLanes::Range
Avx2SampleLanes::range(const short* samples, std::size_t count) const
{
    constexpr std::size_t lanes = 4;
    if (count < lanes * block)
        return SampleLanes::range(samples, count);
    __m256i least[lanes];
    __m256i largest[lanes];
    for (std::size_t i = 0; i < lanes; ++i)
        least[i] = largest[i] = load(samples + i * block);
    std::size_t at = lanes * block;
    for (; at + lanes * block <= count; at += lanes * block)
        for (std::size_t i = 0; i < lanes; ++i) {
            const __m256i here = load(samples + at + i * block);
            least[i] = _mm256_min_epi16(least[i], here);
            largest[i] = _mm256_max_epi16(largest[i], here);
        }
    // The last blocks once more, now up to the end.
    short ends[2 * lanes * block];
    for (std::size_t i = 0; i < lanes; ++i) {
        const __m256i last = load(samples + count - (i + 1) * block);
        store(ends + 2 * i * block, _mm256_min_epi16(least[i], last));
        store(ends + (2 * i + 1) * block, _mm256_max_epi16(largest[i], last));
    }
    return SampleLanes::range(ends, 2 * lanes * block);
}

[[gnu::target("avx2")]] float
Avx2SampleLanes::sum_of_squares(const short* samples, std::size_t count,
                                float sum) const
{
    std::size_t at = 0;
    while (count - at >= Squares::count) {
        if (sum >= SumUnits::least_sum)
            at += add_plain_squares(samples + at, count - at, sum);
        const std::size_t next = std::min(Squares::count, count - at);
        sum = SampleLanes::sum_of_squares(samples + at, next, sum);
        at += next;
    }
    return SampleLanes::sum_of_squares(samples + at, count - at, sum);
}

void Avx2SampleLanes::interpolate(const short* samples, short* to,
                                  std::size_t count, const Steps& steps) const
{
    std::size_t at = 0;
    if (count >= half && Period::can_do(steps))
        at = interpolate_close(samples, to, count, steps,
                               last_place(steps, count));
    else if (PlaceLanes::can_do(steps))
        at = interpolate_anywhere(samples, to, count, steps);
    const Rest rest = after(steps, at);
    SampleLanes::interpolate(samples + rest.index, to + at, count - at,
                             rest.steps);
}

void Avx2SampleLanes::repeat(const short* frames, short* to, std::size_t count,
                             const Steps& steps) const
{
    std::size_t at = 0;
    if (count >= half && Period::can_do(steps))
        at = repeat_close(frames, to, count, steps, last_place(steps, count));
    else if (PlaceLanes::can_do(steps))
        at = repeat_anywhere(frames, to, count, steps);
    const Rest rest = after(steps, at);
    SampleLanes::repeat(frames + 2 * rest.index, to + 2 * at, count - at,
                        rest.steps);
}

[[gnu::target("avx2")]] void
Avx2SampleLanes::to_big_bytes(const short* samples, unsigned char* bytes,
                              std::size_t count) const
{
    std::size_t at = 0;
    for (; at + block <= count; at += block) {
        const __m256i here = load(samples + at);
        store(bytes + 2 * at, _mm256_or_si256(_mm256_slli_epi16(here, 8),
                                              _mm256_srli_epi16(here, 8)));
    }
    SampleLanes::to_big_bytes(samples + at, bytes + 2 * at, count - at);
}

const SampleLanes* avx2_sample_lanes()
{
    return processor_has_avx2() ? &avx2_lanes : nullptr;
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
