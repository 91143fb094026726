#include "platform/x86/video_lanes_avx512.h"

#if defined(__x86_64__) || defined(__i386__)

#include "platform/x86/processor.h"
#include "platform/x86/video_lanes_avx2.h"

// The compiler's own header has variables that are meant to be undefined.
#if defined(__GNUC__) && !defined(__clang__)
#pragma GCC diagnostic ignored "-Wuninitialized"
#pragma GCC diagnostic ignored "-Wmaybe-uninitialized"
#endif
#include <immintrin.h>

// The same as with 256 bits, see there, for 16 pairs at a time. What is left
// over of a line goes to the narrower lanes.

namespace zt_platform {

namespace {

constexpr std::size_t block_pairs = 16;
constexpr __mmask32 odd_halves = 0xAAAAAAAA;

/// Sixteen pixels: in each 32 bits blue and red, and green twice.
struct Pixels
{
    __m512i blue_red;
    __m512i green_twice;
};

/// Weights in the order of `Pixels`, that of green in two halves.
struct Weights
{
    __m512i blue_red;
    __m512i green_halves;
};

[[gnu::target("avx512f,avx512bw,avx512vl,avx512vnni")]] __m512i
pair_of_words(int low, int high)
{
    return _mm512_set1_epi32(
        static_cast<int>((static_cast<unsigned>(high) << 16) |
                         (static_cast<unsigned>(low) & 0xFFFF)));
}

[[gnu::target("avx512f,avx512bw,avx512vl,avx512vnni")]] Weights
weights_of(const ChannelWeights& weights)
{
    const int half = weights.green / 2;
    return {pair_of_words(weights.blue, weights.red),
            pair_of_words(half, weights.green - half)};
}

struct Mix
{
    Weights luma;
    Weights first[2];
    Weights second[2];
    __m512i luma_offset;
    __m512i chroma_offsets;
};

[[gnu::target("avx512f,avx512bw,avx512vl,avx512vnni")]] Mix
mix_of(const VideoMix& video)
{
    return {
        weights_of(video.luma),
        {weights_of(video.chroma[0].first), weights_of(video.chroma[1].first)},
        {weights_of(video.chroma[0].second),
         weights_of(video.chroma[1].second)},
        _mm512_set1_epi16(static_cast<short>(video.luma_offset)),
        pair_of_words(video.chroma[0].offset, video.chroma[1].offset)};
}

/// What one block leaves to the next, in the lanes where it is needed.
struct Carry
{
    __m512i luma;      ///< In all lanes of 16 bits.
    __m512i chroma;    ///< Both, in all lanes of 32 bits.
    __m512i second[2]; ///< In the highest lane of 32 bits.
};

/// Adds weighed pixels to sums.
[[gnu::target("avx512f,avx512bw,avx512vl,avx512vnni")]] __m512i
weighed(__m512i sums, const Pixels& pixels, const Weights& weights)
{
    return _mm512_dpwssd_epi32(
        _mm512_dpwssd_epi32(sums, pixels.blue_red, weights.blue_red),
        pixels.green_twice, weights.green_halves);
}

[[gnu::target("avx512f,avx512bw,avx512vl,avx512vnni")]] Pixels
pixels_of(__m512i words)
{
    const __m512i green = _mm512_broadcast_i32x4(_mm_setr_epi8(
        2, -1, 2, -1, 6, -1, 6, -1, 10, -1, 10, -1, 14, -1, 14, -1));
    return {_mm512_srli_epi16(words, 8), _mm512_shuffle_epi8(words, green)};
}

[[gnu::target("avx512f,avx512bw,avx512vl,avx512vnni")]] __m512i
low_halves(__m512i even, __m512i odd)
{
    return _mm512_mask_blend_epi16(odd_halves, even,
                                   _mm512_slli_epi32(odd, 16));
}

[[gnu::target("avx512f,avx512bw,avx512vl,avx512vnni")]] __m512i
high_halves(__m512i even, __m512i odd)
{
    return _mm512_mask_blend_epi16(odd_halves, _mm512_srli_epi32(even, 16),
                                   odd);
}

/// Gives the whole parts of sums and their offsets: one more where
/// `fractions`, running sums of `low`, have wrapped.
[[gnu::target("avx512f,avx512bw,avx512vl,avx512vnni")]] __m512i
whole_parts(__m512i high, __m512i low, __m512i fractions, __m512i offsets)
{
    const __m512i wholes = _mm512_add_epi16(high, offsets);
    return _mm512_mask_add_epi16(wholes,
                                 _mm512_cmplt_epu16_mask(fractions, low),
                                 wholes, _mm512_set1_epi16(1));
}

/// Adds to the sums of each quarter of a register the totals of the quarters
/// before it and the carry, and all of them to the carry. `totals` holds each
/// quarter's total in all its lanes.
[[gnu::target("avx512f,avx512bw,avx512vl,avx512vnni")]] __m512i
running_sums(__m512i sums, __m512i totals, __m512i& carry)
{
    const __m512i none = _mm512_setzero_si512();
    const __m512i of_two =
        _mm512_add_epi16(totals, _mm512_alignr_epi64(totals, none, 6));
    const __m512i of_all =
        _mm512_add_epi16(of_two, _mm512_alignr_epi64(of_two, none, 4));
    const __m512i before = _mm512_sub_epi16(of_all, totals);
    sums = _mm512_add_epi16(_mm512_add_epi16(sums, before), carry);
    carry = _mm512_add_epi16(carry, _mm512_shuffle_i64x2(of_all, of_all, 0xFF));
    return sums;
}

/// Mixes the lumas of 16 pairs.
[[gnu::target("avx512f,avx512bw,avx512vl,avx512vnni")]] __m512i
lumas_of(const Pixels& first, const Pixels& second, const Mix& mix,
         __m512i& carry)
{
    const __m512i none = _mm512_setzero_si512();
    const __m512i even = weighed(none, first, mix.luma);
    const __m512i odd = weighed(none, second, mix.luma);
    const __m512i low = low_halves(even, odd);
    __m512i sums = _mm512_add_epi16(low, _mm512_bslli_epi128(low, 2));
    sums = _mm512_add_epi16(sums, _mm512_bslli_epi128(sums, 4));
    sums = _mm512_add_epi16(sums, _mm512_bslli_epi128(sums, 8));
    const __m512i totals = _mm512_shuffle_epi8(sums, _mm512_set1_epi16(0x0F0E));
    const __m512i fractions = running_sums(sums, totals, carry);
    return whole_parts(high_halves(even, odd), low, fractions, mix.luma_offset);
}

/// Gives one kind of chroma of 16 pairs, without what is carried.
[[gnu::target("avx512f,avx512bw,avx512vl,avx512vnni")]] __m512i
chroma_of(const Pixels& first, const Pixels& second, const Mix& mix, int kind,
          __m512i& carry)
{
    const __m512i here =
        weighed(_mm512_setzero_si512(), second, mix.second[kind]);
    const __m512i before = _mm512_alignr_epi32(here, carry, 15);
    carry = here;
    return weighed(_mm512_add_epi32(before, here), first, mix.first[kind]);
}

/// Mixes the chromas of 16 pairs.
[[gnu::target("avx512f,avx512bw,avx512vl,avx512vnni")]] __m512i
chromas_of(const Pixels& first, const Pixels& second, const Mix& mix,
           Carry& carry)
{
    const __m512i even = chroma_of(first, second, mix, 0, carry.second[0]);
    const __m512i odd = chroma_of(first, second, mix, 1, carry.second[1]);
    const __m512i low = low_halves(even, odd);
    __m512i sums = _mm512_add_epi16(low, _mm512_bslli_epi128(low, 4));
    sums = _mm512_add_epi16(sums, _mm512_bslli_epi128(sums, 8));
    const __m512i totals = _mm512_shuffle_epi32(sums, _MM_PERM_DDDD);
    const __m512i fractions = running_sums(sums, totals, carry.chroma);
    return whole_parts(high_halves(even, odd), low, fractions,
                       mix.chroma_offsets);
}

/// Mixes 16 pairs into 64 bytes.
[[gnu::target("avx512f,avx512bw,avx512vl,avx512vnni")]] void
mix_block(const std::uint32_t* words, unsigned char* groups, const Mix& mix,
          Carry& carry)
{
    const __m512i evens = _mm512_setr_epi32(0, 2, 4, 6, 8, 10, 12, 14, 16, 18,
                                            20, 22, 24, 26, 28, 30);
    const __m512i odds = _mm512_setr_epi32(1, 3, 5, 7, 9, 11, 13, 15, 17, 19,
                                           21, 23, 25, 27, 29, 31);
    const __m512i left = _mm512_loadu_si512(words);
    const __m512i right = _mm512_loadu_si512(words + 16);
    const Pixels first =
        pixels_of(_mm512_permutex2var_epi32(left, evens, right));
    const Pixels second =
        pixels_of(_mm512_permutex2var_epi32(left, odds, right));
    const __m512i lumas = lumas_of(first, second, mix, carry.luma);
    const __m512i chromas = chromas_of(first, second, mix, carry);
    constexpr int or_of_and = 0xF8; // left | (middle & right)
    _mm512_storeu_si512(groups, _mm512_ternarylogic_epi32(
                                    _mm512_slli_epi16(lumas, 8), chromas,
                                    _mm512_set1_epi16(0x00FF), or_of_and));
}

[[gnu::target("avx512f,avx512bw,avx512vl,avx512vnni")]] Carry
loaded(const VideoCarry& carry)
{
    return {_mm512_set1_epi16(static_cast<short>(carry.luma)),
            pair_of_words(static_cast<int>(carry.chroma[0]),
                          static_cast<int>(carry.chroma[1])),
            {_mm512_set1_epi32(carry.second[0]),
             _mm512_set1_epi32(carry.second[1])}};
}

[[gnu::target("avx512f,avx512bw,avx512vl,avx512vnni")]] int
highest(__m512i lanes)
{
    return _mm_extract_epi32(_mm512_extracti32x4_epi32(lanes, 3), 3);
}

[[gnu::target("avx512f,avx512bw,avx512vl,avx512vnni")]] VideoCarry
stored(const Carry& carry)
{
    const auto chroma = static_cast<std::uint32_t>(highest(carry.chroma));
    return {static_cast<std::uint32_t>(highest(carry.luma)) & 0xFFFF,
            {chroma & 0xFFFF, chroma >> 16},
            {highest(carry.second[0]), highest(carry.second[1])}};
}

/// Weights for two samples in each 32 bits: multiples of 65536, in these units,
/// and the rests, each of 16 bits.
struct SampleWeights
{
    __m512i multiples;
    __m512i rests;
};

[[gnu::target("avx512f,avx512bw,avx512vl,avx512vnni")]] SampleWeights
sample_weights(int low, int high)
{
    const auto multiple = [](int weight) { return (weight + 0x8000) >> 16; };
    // Of the rests, which may be negative, only the low halves are taken.
    return {pair_of_words(multiple(low), multiple(high)),
            pair_of_words(low, high & 0xFFFF)};
}

/// The weights of the samples of a group and their offsets.
struct Colors
{
    SampleWeights first_luma;
    SampleWeights second_luma;
    SampleWeights red;
    SampleWeights green;
    SampleWeights blue;
    __m512i luma_offset;   ///< In bytes, where the lumas are.
    __m512i chroma_offset; ///< In words.
};

[[gnu::target("avx512f,avx512bw,avx512vl,avx512vnni")]] Colors
colors_of(const VideoColors& video)
{
    return {sample_weights(video.luma, 0),
            sample_weights(0, video.luma),
            sample_weights(video.red.first, video.red.second),
            sample_weights(video.green.first, video.green.second),
            sample_weights(video.blue.first, video.blue.second),
            _mm512_set1_epi16(static_cast<short>(video.luma_offset << 8)),
            _mm512_set1_epi16(static_cast<short>(video.chroma_offset))};
}

/// Gives the sums of two samples each, in 32 bits.
[[gnu::target("avx512f,avx512bw,avx512vl,avx512vnni")]] __m512i
weighed(__m512i samples, const SampleWeights& weights)
{
    const __m512i wholes = _mm512_madd_epi16(samples, weights.multiples);
    return _mm512_dpwssd_epi32(_mm512_slli_epi32(wholes, 16), samples,
                               weights.rests);
}

/// Two sums for each group: of its first and of its second pixel.
struct Sums
{
    __m512i first;
    __m512i second;
};

/// Gives the whole parts of one channel of 32 pixels, in order.
[[gnu::target("avx512f,avx512bw,avx512vl,avx512vnni")]] __m512i
channel_of(const Sums& lumas, __m512i chromas)
{
    return high_halves(_mm512_add_epi32(lumas.first, chromas),
                       _mm512_add_epi32(lumas.second, chromas));
}

/// Stores 32 pixels of channels that are not clamped yet, the lowest first.
[[gnu::target("avx512f,avx512bw,avx512vl,avx512vnni")]] void
store_pixels(__m512i byte0, __m512i byte1, __m512i byte2, __m512i byte3,
             std::uint32_t* pixels)
{
    const __m512i even = _mm512_packus_epi16(byte0, byte2);
    const __m512i odd = _mm512_packus_epi16(byte1, byte3);
    const __m512i low_bytes = _mm512_unpacklo_epi8(even, odd);
    const __m512i high_bytes = _mm512_unpackhi_epi8(even, odd);
    const __m512i low = _mm512_unpacklo_epi16(low_bytes, high_bytes);
    const __m512i high = _mm512_unpackhi_epi16(low_bytes, high_bytes);
    const __m512i left = _mm512_setr_epi64(0, 1, 8, 9, 2, 3, 10, 11);
    const __m512i right = _mm512_setr_epi64(4, 5, 12, 13, 6, 7, 14, 15);
    _mm512_storeu_si512(pixels, _mm512_permutex2var_epi64(low, left, high));
    _mm512_storeu_si512(pixels + 16,
                        _mm512_permutex2var_epi64(low, right, high));
}

/// Makes 32 pixels of 16 groups.
template <bool red_lowest>
[[gnu::target("avx512f,avx512bw,avx512vl,avx512vnni")]] void
color_block(const unsigned char* groups, std::uint32_t* pixels,
            const Colors& colors)
{
    const __m512i samples = _mm512_loadu_si512(groups);
    const __m512i lumas =
        _mm512_srli_epi16(_mm512_subs_epu8(samples, colors.luma_offset), 8);
    const __m512i chromas =
        _mm512_sub_epi16(_mm512_and_si512(samples, _mm512_set1_epi16(0x00FF)),
                         colors.chroma_offset);
    const Sums grey = {weighed(lumas, colors.first_luma),
                       weighed(lumas, colors.second_luma)};
    const __m512i red = channel_of(grey, weighed(chromas, colors.red));
    const __m512i green = channel_of(grey, weighed(chromas, colors.green));
    const __m512i blue = channel_of(grey, weighed(chromas, colors.blue));
    const __m512i none = _mm512_setzero_si512();
    if (red_lowest)
        store_pixels(red, green, blue, none, pixels);
    else
        store_pixels(none, blue, green, red, pixels);
}

/// Makes pixels of as many groups as there are whole blocks of them.
///
/// Returns: the number of these groups.
template <bool red_lowest>
[[gnu::target("avx512f,avx512bw,avx512vl,avx512vnni")]] std::size_t
color_blocks(const unsigned char* groups, std::uint32_t* pixels,
             std::size_t pairs, const Colors& colors)
{
    std::size_t at = 0;
    for (; at + block_pairs <= pairs; at += block_pairs)
        color_block<red_lowest>(groups + 4 * at, pixels + 2 * at, colors);
    return at;
}

class Avx512VideoLanes final : public VideoLanes
{
public:
    const char* name() const override { return "avx512"; }

    [[gnu::target("avx512f,avx512bw,avx512vl,avx512vnni")]] void
    mix(const std::uint32_t* pixels, unsigned char* groups, std::size_t pairs,
        const VideoMix& video, VideoCarry& carry) const override
    {
        const Mix mix = mix_of(video);
        Carry wide = loaded(carry);
        std::size_t at = 0;
        for (; at + block_pairs <= pairs; at += block_pairs)
            mix_block(pixels + 2 * at, groups + 4 * at, mix, wide);
        carry = stored(wide);
        avx2_video_lanes()->mix(pixels + 2 * at, groups + 4 * at, pairs - at,
                                video, carry);
    }

    [[gnu::target("avx512f,avx512bw,avx512vl,avx512vnni")]] void
    color(const unsigned char* groups, std::uint32_t* pixels, std::size_t pairs,
          const VideoColors& video) const override
    {
        const Colors colors = colors_of(video);
        const std::size_t done =
            video.red_lowest
                ? color_blocks<true>(groups, pixels, pairs, colors)
                : color_blocks<false>(groups, pixels, pairs, colors);
        avx2_video_lanes()->color(groups + 4 * done, pixels + 2 * done,
                                  pairs - done, video);
    }
};

constinit const Avx512VideoLanes avx512_lanes;

} // namespace

const VideoLanes* avx512_video_lanes()
{
    return processor_has_avx512_vnni() && avx2_video_lanes() ? &avx512_lanes
                                                             : nullptr;
}

} // namespace zt_platform

#else

namespace zt_platform {

const VideoLanes* avx512_video_lanes()
{
    return nullptr;
}

} // namespace zt_platform

#endif
