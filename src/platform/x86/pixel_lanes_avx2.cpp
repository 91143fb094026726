#include "platform/x86/pixel_lanes_avx2.h"

#if defined(__x86_64__) || defined(__i386__)

#include "platform/unpack_rows.h"
#include "platform/x86/processor.h"

#include <bit>
#include <immintrin.h>

// Every operation does whole blocks and leaves the rest of the row to the
// plain one. Loads and stores touch nothing outside the rows, but for the slack
// of those that are unpacked.

namespace zt_platform {

namespace {

constexpr std::size_t block = 32; ///< Bytes of a register.

[[gnu::target("avx2")]] __m256i load(const void* from)
{
    return _mm256_loadu_si256(static_cast<const __m256i*>(from));
}

[[gnu::target("avx2")]] void store(void* to, __m256i value)
{
    _mm256_storeu_si256(static_cast<__m256i*>(to), value);
}

/// Makes 32 words of 32 bytes of each row.
///
/// The interleaving works in the two halves of a register by themselves, so
/// its results hold words 4 apart in one and 16 further on in the other half;
/// the last step puts the halves together in order.
[[gnu::target("avx2")]] void join_block(const unsigned char* const (&bytes)[4],
                                        std::size_t at, std::uint32_t* words)
{
    __m256i byte0 = load(bytes[0] + at);
    __m256i byte1 = load(bytes[1] + at);
    __m256i byte2 = load(bytes[2] + at);
    __m256i byte3 = load(bytes[3] + at);
    __m256i low01 = _mm256_unpacklo_epi8(byte0, byte1);
    __m256i low23 = _mm256_unpacklo_epi8(byte2, byte3);
    __m256i high01 = _mm256_unpackhi_epi8(byte0, byte1);
    __m256i high23 = _mm256_unpackhi_epi8(byte2, byte3);
    __m256i words0 = _mm256_unpacklo_epi16(low01, low23);
    __m256i words4 = _mm256_unpackhi_epi16(low01, low23);
    __m256i words8 = _mm256_unpacklo_epi16(high01, high23);
    __m256i words12 = _mm256_unpackhi_epi16(high01, high23);
    store(words, _mm256_permute2x128_si256(words0, words4, 0x20));
    store(words + 8, _mm256_permute2x128_si256(words8, words12, 0x20));
    store(words + 16, _mm256_permute2x128_si256(words0, words4, 0x31));
    store(words + 24, _mm256_permute2x128_si256(words8, words12, 0x31));
}

/// Sorts the bytes of 8 words: the 8 lowest bytes first, the 8 highest last.
[[gnu::target("avx2")]] __m256i sort_bytes(const std::uint32_t* words)
{
    const __m256i in_halves = _mm256_broadcastsi128_si256(
        _mm_setr_epi8(0, 4, 8, 12, 1, 5, 9, 13, 2, 6, 10, 14, 3, 7, 11, 15));
    const __m256i over_halves = _mm256_setr_epi32(0, 4, 1, 5, 2, 6, 3, 7);
    return _mm256_permutevar8x32_epi32(
        _mm256_shuffle_epi8(load(words), in_halves), over_halves);
}

/// Takes 32 words apart into 32 bytes of each row.
[[gnu::target("avx2")]] void split_block(const std::uint32_t* words,
                                         unsigned char* const (&bytes)[4],
                                         std::size_t at)
{
    __m256i words0 = sort_bytes(words);
    __m256i words8 = sort_bytes(words + 8);
    __m256i words16 = sort_bytes(words + 16);
    __m256i words24 = sort_bytes(words + 24);
    __m256i first02 = _mm256_unpacklo_epi64(words0, words8);
    __m256i first13 = _mm256_unpackhi_epi64(words0, words8);
    __m256i last02 = _mm256_unpacklo_epi64(words16, words24);
    __m256i last13 = _mm256_unpackhi_epi64(words16, words24);
    store(bytes[0] + at, _mm256_permute2x128_si256(first02, last02, 0x20));
    store(bytes[1] + at, _mm256_permute2x128_si256(first13, last13, 0x20));
    store(bytes[2] + at, _mm256_permute2x128_si256(first02, last02, 0x31));
    store(bytes[3] + at, _mm256_permute2x128_si256(first13, last13, 0x31));
}

/// Turns the four 4 x 4 quarters of an 8 x 8 block of words by themselves,
/// the left ones in the low, the right ones in the high halves of registers:
/// then the columns of both upper or of both lower quarters.
struct Columns
{
    __m256i both[4]; ///< Column 0 and 4, 1 and 5, 2 and 6, 3 and 7.
};

[[gnu::target("avx2")]] Columns turn_half(const std::uint32_t* words,
                                          std::size_t stride)
{
    __m256i row0 = load(words);
    __m256i row1 = load(words + stride);
    __m256i row2 = load(words + 2 * stride);
    __m256i row3 = load(words + 3 * stride);
    __m256i low01 = _mm256_unpacklo_epi32(row0, row1);
    __m256i high01 = _mm256_unpackhi_epi32(row0, row1);
    __m256i low23 = _mm256_unpacklo_epi32(row2, row3);
    __m256i high23 = _mm256_unpackhi_epi32(row2, row3);
    return {{_mm256_unpacklo_epi64(low01, low23),
             _mm256_unpackhi_epi64(low01, low23),
             _mm256_unpacklo_epi64(high01, high23),
             _mm256_unpackhi_epi64(high01, high23)}};
}

/// Words that are picked together, and the words before the last of them that
/// they may come from without being fetched one by one.
constexpr std::size_t picked_words = 8;
constexpr int window_words = 16;

[[gnu::target("avx2")]] __m256i fetch_block(const std::uint32_t* words,
                                            __m256i places)
{
    // Starting from no words at all, nothing older is waited for.
    return _mm256_mask_i32gather_epi32(
        _mm256_setzero_si256(), reinterpret_cast<const int*>(words), places,
        _mm256_set1_epi32(-1), sizeof *words);
}

/// Picks out of the window that ends with the last of these places.
[[gnu::target("avx2")]] __m256i pick_in_window(const std::uint32_t* window,
                                               const int* places)
{
    const __m256i last =
        _mm256_broadcastd_epi32(_mm_loadu_si32(places + picked_words - 1));
    const __m256i in_window =
        _mm256_add_epi32(_mm256_sub_epi32(load(places), last),
                         _mm256_set1_epi32(window_words - 1));
    const __m256i low = _mm256_permutevar8x32_epi32(load(window), in_window);
    const __m256i high =
        _mm256_permutevar8x32_epi32(load(window + window_words / 2), in_window);
    // Bit 3 of the place says which half; as the sign it chooses.
    const __m256i half = _mm256_slli_epi32(in_window, 28);
    return _mm256_castps_si256(_mm256_blendv_ps(_mm256_castsi256_ps(low),
                                                _mm256_castsi256_ps(high),
                                                _mm256_castsi256_ps(half)));
}

[[gnu::target("avx2")]] __m256i pick_block(const std::uint32_t* words,
                                           const int* places)
{
    const int start = places[picked_words - 1] - (window_words - 1);
    return start < 0 || places[0] < start
               ? fetch_block(words, load(places))
               : pick_in_window(words + start, places);
}

/// Pixels that are averaged together, and registers for their values: three a
/// pixel, four in a register.
constexpr std::size_t averaged_pixels = 8;
constexpr std::size_t averaged_registers = 6;

struct Values
{
    __m256d quarter[averaged_registers];
};

/// Gives the four values at the places in `pixels` that `places` says, as
/// numbers: set as the low bits of 2^52, of which 2^52 is then taken away.
[[gnu::target("avx2")]] __m256d number_of(__m256i pixels, __m256i places)
{
    const __m256i large = _mm256_set1_epi64x(0x4330000000000000);
    return _mm256_sub_pd(_mm256_castsi256_pd(_mm256_or_si256(
                             _mm256_shuffle_epi8(pixels, places), large)),
                         _mm256_castsi256_pd(large));
}

/// Reads the three low values of each of 8 pixels.
[[gnu::target("avx2")]] Values values_of(const std::uint32_t* pixels)
{
    // In each 8 bytes one place, the other seven cleared.
    constexpr long long none = ~0xFFLL;
    const __m256i first =
        _mm256_setr_epi64x(none | 0, none | 1, none | 2, none | 4);
    const __m256i second =
        _mm256_setr_epi64x(none | 5, none | 6, none | 8, none | 9);
    const __m256i third =
        _mm256_setr_epi64x(none | 10, none | 12, none | 13, none | 14);
    Values values;
    for (std::size_t half = 0; half < 2; ++half) {
        __m256i twice = _mm256_broadcastsi128_si256(_mm_loadu_si128(
            reinterpret_cast<const __m128i*>(pixels + 4 * half)));
        values.quarter[3 * half] = number_of(twice, first);
        values.quarter[3 * half + 1] = number_of(twice, second);
        values.quarter[3 * half + 2] = number_of(twice, third);
    }
    return values;
}

/// Writes 8 pixels whose three low values are these, cut to integers.
[[gnu::target("avx2")]] void store_pixels(const Values& values,
                                          std::uint32_t* pixels)
{
    const __m128i spread =
        _mm_setr_epi8(0, 1, 2, -1, 3, 4, 5, -1, 6, 7, 8, -1, 9, 10, 11, -1);
    for (std::size_t half = 0; half < 2; ++half) {
        const __m256d* quarter = values.quarter + 3 * half;
        __m128i first = _mm_packs_epi32(_mm256_cvttpd_epi32(quarter[0]),
                                        _mm256_cvttpd_epi32(quarter[1]));
        __m128i last = _mm256_cvttpd_epi32(quarter[2]);
        __m128i bytes = _mm_packus_epi16(first, _mm_packs_epi32(last, last));
        _mm_storeu_si128(reinterpret_cast<__m128i*>(pixels + 4 * half),
                         _mm_shuffle_epi8(bytes, spread));
    }
}

[[gnu::target("avx2")]] Values scaled(Values values, double factor)
{
    for (__m256d& quarter : values.quarter)
        quarter = _mm256_mul_pd(quarter, _mm256_set1_pd(factor));
    return values;
}

[[gnu::target("avx2")]] Values sum_of(Values left, const Values& right)
{
    for (std::size_t i = 0; i < averaged_registers; ++i)
        left.quarter[i] = _mm256_add_pd(left.quarter[i], right.quarter[i]);
    return left;
}

/// Averages 8 pixels, each value by the formula of the plain operation; of a
/// first line that counts whole its formula leaves the values themselves.
[[gnu::target("avx2")]] void average_block(const PixelLanes::Average& lines,
                                           std::size_t at,
                                           std::uint32_t* averages)
{
    Values sum = values_of(lines.lines[0] + at);
    if (lines.head != 1.0)
        sum = sum_of(scaled(sum, lines.head),
                     scaled(values_of(lines.lines[1] + at), 1.0 - lines.head));
    if (lines.whole == 0) {
        sum = scaled(sum, lines.tail);
    } else {
        sum = scaled(sum, lines.head);
        for (std::size_t line = 1; line < lines.whole; ++line)
            sum = sum_of(sum, values_of(lines.lines[line] + at));
        sum = sum_of(
            sum, scaled(values_of(lines.lines[lines.whole] + at), lines.tail));
    }
    store_pixels(scaled(sum, lines.scale), averages + at);
}

/// Registers of 32 bytes.
struct Avx2Wide
{
    static constexpr std::size_t block = zt_platform::block;

    [[gnu::target("avx2")]] static void
    copy(unsigned char* to, const unsigned char* from, std::size_t)
    {
        for (std::size_t at = 0; at < PixelLanes::packet_slack; at += block)
            store(to + at, load(from + at));
    }

    [[gnu::target("avx2")]] static void
    fill(unsigned char* to, unsigned char value, std::size_t count)
    {
        const __m256i values = _mm256_set1_epi8(static_cast<char>(value));
        store(to, values);
        if (count > block)
            for (std::size_t at = block; at < PixelLanes::packet_slack;
                 at += block)
                store(to + at, values);
    }

    [[gnu::target("avx2")]] static void
    join(const unsigned char* const (&rows)[4], std::size_t at,
         std::uint32_t* words)
    {
        join_block(rows, at, words);
    }
};

/// What it says of the operations is said where they are first declared.
class Avx2PixelLanes final : public PixelLanes
{
public:
    const char* name() const override;
    void join(const unsigned char* const (&bytes)[4], std::uint32_t* words,
              std::size_t count) const override;
    bool unpack(const PackedRow (&rows)[4], Packets packets,
                const Joining& beside) const override;
    void split(const std::uint32_t* words, unsigned char* const (&bytes)[4],
               std::size_t count) const override;
    std::size_t find_three_equal(const unsigned char* bytes,
                                 std::size_t count) const override;
    std::size_t count_equal(const unsigned char* bytes,
                            std::size_t count) const override;
    void turn(const std::uint32_t* words, std::size_t stride,
              std::uint32_t* columns,
              std::size_t columns_stride) const override;
    void pick(const std::uint32_t* words, const int* places,
              std::uint32_t* picked, std::size_t count) const override;
    void average(const Average& lines, std::uint32_t* averages,
                 std::size_t count) const override;
};

constinit const Avx2PixelLanes avx2_lanes;

const char* Avx2PixelLanes::name() const
{
    return "avx2";
}

[[gnu::target("avx2")]] void
Avx2PixelLanes::join(const unsigned char* const (&bytes)[4],
                     std::uint32_t* words, std::size_t count) const
{
    std::size_t at = 0;
    for (; at + block <= count; at += block)
        join_block(bytes, at, words + at);
    PixelLanes::join(
        {bytes[0] + at, bytes[1] + at, bytes[2] + at, bytes[3] + at},
        words + at, count - at);
}

[[gnu::target("avx2")]] void
Avx2PixelLanes::split(const std::uint32_t* words,
                      unsigned char* const (&bytes)[4], std::size_t count) const
{
    std::size_t at = 0;
    for (; at + block <= count; at += block)
        split_block(words + at, bytes, at);
    PixelLanes::split(
        words + at,
        {bytes[0] + at, bytes[1] + at, bytes[2] + at, bytes[3] + at},
        count - at);
}

[[gnu::target("avx2")]] std::size_t
Avx2PixelLanes::find_three_equal(const unsigned char* bytes,
                                 std::size_t count) const
{
    std::size_t at = 0;
    for (; at + block + 2 <= count; at += block) {
        __m256i middle = load(bytes + at + 1);
        __m256i equal =
            _mm256_and_si256(_mm256_cmpeq_epi8(load(bytes + at), middle),
                             _mm256_cmpeq_epi8(middle, load(bytes + at + 2)));
        unsigned found = static_cast<unsigned>(_mm256_movemask_epi8(equal));
        if (found)
            return at + static_cast<unsigned>(std::countr_zero(found));
    }
    return at + PixelLanes::find_three_equal(bytes + at, count - at);
}

[[gnu::target("avx2")]] std::size_t
Avx2PixelLanes::count_equal(const unsigned char* bytes, std::size_t count) const
{
    const __m256i first = _mm256_set1_epi8(static_cast<char>(bytes[0]));
    for (std::size_t at = 0; at + block <= count; at += block) {
        unsigned equal = static_cast<unsigned>(
            _mm256_movemask_epi8(_mm256_cmpeq_epi8(load(bytes + at), first)));
        if (equal != 0xFFFFFFFF)
            return at + static_cast<unsigned>(std::countr_one(equal));
    }
    std::size_t at = count - count % block;
    while (at < count && bytes[at] == bytes[0])
        ++at;
    return at;
}

[[gnu::target("avx2")]] void
Avx2PixelLanes::turn(const std::uint32_t* words, std::size_t stride,
                     std::uint32_t* columns, std::size_t columns_stride) const
{
    Columns upper = turn_half(words, stride);
    Columns lower = turn_half(words + 4 * stride, stride);
    for (std::size_t i = 0; i < 4; ++i) {
        store(columns + i * columns_stride,
              _mm256_permute2x128_si256(upper.both[i], lower.both[i], 0x20));
        store(columns + (i + 4) * columns_stride,
              _mm256_permute2x128_si256(upper.both[i], lower.both[i], 0x31));
    }
}

[[gnu::target("avx2")]] void Avx2PixelLanes::pick(const std::uint32_t* words,
                                                  const int* places,
                                                  std::uint32_t* picked,
                                                  std::size_t count) const
{
    std::size_t at = 0;
    for (; at + picked_words <= count; at += picked_words)
        store(picked + at, pick_block(words, places + at));
    PixelLanes::pick(words, places + at, picked + at, count - at);
}

[[gnu::target("avx2")]] void Avx2PixelLanes::average(const Average& lines,
                                                     std::uint32_t* averages,
                                                     std::size_t count) const
{
    std::size_t at = 0;
    for (; at + averaged_pixels <= count; at += averaged_pixels)
        average_block(lines, at, averages);
    average_from(lines, averages, at, count);
}

[[gnu::target("avx2")]] bool Avx2PixelLanes::unpack(const PackedRow (&rows)[4],
                                                    Packets packets,
                                                    const Joining& beside) const
{
    return unpack_rows<Avx2Wide>(*this, rows, packets, beside);
}

} // namespace

const PixelLanes* avx2_pixel_lanes()
{
    return processor_has_avx2() ? &avx2_lanes : nullptr;
}

} // namespace zt_platform

#else

namespace zt_platform {

const PixelLanes* avx2_pixel_lanes()
{
    return nullptr;
}

} // namespace zt_platform

#endif
