#include "platform/x86/video_lanes_avx2.h"

#if defined(__x86_64__) || defined(__i386__)

#include "platform/x86/processor.h"

#include <immintrin.h>

// Fractions carried from sum to sum are a running sum modulo 65536 of the
// sums' own low halves, so they need no waiting for each other: 16 of them are
// added up in lanes of 16 bits, in steps of 1, 2, 4 and 8 lanes. A sum gains
// one in its high half exactly where the running sum has wrapped, that is
// where it is less than what was added last.
//
// The lumas of 8 pairs fill a register in order, first, second, first, second;
// so do the two chromas. That is also the order of the bytes in the groups.
//
// The other way there is nothing to carry. Weights are taken apart into
// multiples of 65536 and rests, both of 16 bits, so that two samples at a time
// are weighed exactly; the whole part of a sum is its high half.

namespace zt_platform {

namespace {

constexpr std::size_t block_pairs = 8;

/// Eight pixels, ready to be weighed: in each 32 bits blue and red, and green
/// twice, since half of its weight fits where the whole might not.
struct Pixels
{
    __m256i blue_red;
    __m256i green_twice;
};

/// Weights in the order of `Pixels`.
struct Weights
{
    __m256i blue_red;
    __m256i green_halves;
};

[[gnu::target("avx2")]] __m256i pair_of_words(int low, int high)
{
    return _mm256_set1_epi32(
        static_cast<int>((static_cast<unsigned>(high) << 16) |
                         (static_cast<unsigned>(low) & 0xFFFF)));
}

[[gnu::target("avx2")]] Weights weights_of(const ChannelWeights& weights)
{
    const int half = weights.green / 2;
    return {pair_of_words(weights.blue, weights.red),
            pair_of_words(half, weights.green - half)};
}

/// The weights of a mix and its offsets, one lane for each sum.
struct Mix
{
    Weights luma;
    Weights first[2];
    Weights second[2];
    __m256i luma_offset;
    __m256i chroma_offsets;
};

[[gnu::target("avx2")]] Mix mix_of(const VideoMix& video)
{
    // One more than the offset: where nothing wraps one is taken away.
    return {
        weights_of(video.luma),
        {weights_of(video.chroma[0].first), weights_of(video.chroma[1].first)},
        {weights_of(video.chroma[0].second),
         weights_of(video.chroma[1].second)},
        _mm256_set1_epi16(static_cast<short>(video.luma_offset + 1)),
        pair_of_words(video.chroma[0].offset + 1, video.chroma[1].offset + 1)};
}

/// What one block leaves to the next, in the lanes where it is added.
struct Carry
{
    __m256i luma;      ///< In all lanes of 16 bits.
    __m256i chroma;    ///< Both, in all lanes of 32 bits.
    __m256i second[2]; ///< In the lowest lane of 32 bits.
};

[[gnu::target("avx2")]] __m256i weighed(const Pixels& pixels,
                                        const Weights& weights)
{
    return _mm256_add_epi32(
        _mm256_madd_epi16(pixels.blue_red, weights.blue_red),
        _mm256_madd_epi16(pixels.green_twice, weights.green_halves));
}

[[gnu::target("avx2")]] Pixels pixels_of(__m256i words)
{
    const __m256i green = _mm256_set1_epi32(static_cast<int>(0xFF02FF02));
    const __m256i word =
        _mm256_setr_epi32(0x00000000, 0x04040404, 0x08080808, 0x0C0C0C0C,
                          0x00000000, 0x04040404, 0x08080808, 0x0C0C0C0C);
    return {_mm256_srli_epi16(words, 8),
            _mm256_shuffle_epi8(words, _mm256_or_si256(green, word))};
}

/// Loads the words at `low` and at `high` into the halves of a register.
[[gnu::target("avx2")]] __m256 load_halves(const std::uint32_t* low,
                                           const std::uint32_t* high)
{
    return _mm256_castsi256_ps(
        _mm256_loadu2_m128i(reinterpret_cast<const __m128i*>(high),
                            reinterpret_cast<const __m128i*>(low)));
}

/// Puts the low halves of two rows of sums side by side, those of `even` in
/// the even lanes.
[[gnu::target("avx2")]] __m256i low_halves(__m256i even, __m256i odd)
{
    return _mm256_blend_epi16(even, _mm256_slli_epi32(odd, 16), 0xAA);
}

/// Does the same with the high halves.
[[gnu::target("avx2")]] __m256i high_halves(__m256i even, __m256i odd)
{
    return _mm256_blend_epi16(_mm256_srli_epi32(even, 16), odd, 0xAA);
}

/// Gives the whole parts of sums and their offsets, given the offsets and one:
/// one is taken away where `fractions`, running sums of `low`, did not wrap.
[[gnu::target("avx2")]] __m256i whole_parts(__m256i high, __m256i low,
                                            __m256i fractions, __m256i offsets)
{
    const __m256i not_wrapped =
        _mm256_cmpeq_epi16(_mm256_max_epu16(fractions, low), fractions);
    return _mm256_add_epi16(_mm256_add_epi16(high, offsets), not_wrapped);
}

/// Adds the total of the low half of a register to every lane of the high one,
/// and both to the carry. `totals` holds each half's total in all its lanes.
[[gnu::target("avx2")]] __m256i running_sums(__m256i sums, __m256i totals,
                                             __m256i& carry)
{
    const __m256i of_low_half = _mm256_permute2x128_si256(totals, totals, 0x08);
    const __m256i other_half = _mm256_permute2x128_si256(totals, totals, 0x01);
    sums = _mm256_add_epi16(_mm256_add_epi16(sums, of_low_half), carry);
    carry = _mm256_add_epi16(carry, _mm256_add_epi16(totals, other_half));
    return sums;
}

/// Mixes the lumas of 8 pairs.
[[gnu::target("avx2")]] __m256i lumas_of(const Pixels& first,
                                         const Pixels& second, const Mix& mix,
                                         __m256i& carry)
{
    const __m256i even = weighed(first, mix.luma);
    const __m256i odd = weighed(second, mix.luma);
    const __m256i low = low_halves(even, odd);
    __m256i sums = _mm256_add_epi16(low, _mm256_slli_si256(low, 2));
    sums = _mm256_add_epi16(sums, _mm256_slli_si256(sums, 4));
    sums = _mm256_add_epi16(sums, _mm256_slli_si256(sums, 8));
    const __m256i totals = _mm256_shuffle_epi8(sums, _mm256_set1_epi16(0x0F0E));
    const __m256i fractions = running_sums(sums, totals, carry);
    return whole_parts(high_halves(even, odd), low, fractions, mix.luma_offset);
}

/// Gives one kind of chroma of 8 pairs, without what is carried.
[[gnu::target("avx2")]] __m256i chroma_of(const Pixels& first,
                                          const Pixels& second, const Mix& mix,
                                          int kind, __m256i& carry)
{
    const __m256i here = weighed(second, mix.second[kind]);
    const __m256i turned = _mm256_permutevar8x32_epi32(
        here, _mm256_setr_epi32(7, 0, 1, 2, 3, 4, 5, 6));
    const __m256i before = _mm256_blend_epi32(turned, carry, 1);
    carry = turned;
    return _mm256_add_epi32(
        _mm256_add_epi32(before, weighed(first, mix.first[kind])), here);
}

/// Mixes the chromas of 8 pairs.
[[gnu::target("avx2")]] __m256i chromas_of(const Pixels& first,
                                           const Pixels& second, const Mix& mix,
                                           Carry& carry)
{
    const __m256i even = chroma_of(first, second, mix, 0, carry.second[0]);
    const __m256i odd = chroma_of(first, second, mix, 1, carry.second[1]);
    const __m256i low = low_halves(even, odd);
    __m256i sums = _mm256_add_epi16(low, _mm256_slli_si256(low, 4));
    sums = _mm256_add_epi16(sums, _mm256_slli_si256(sums, 8));
    const __m256i totals = _mm256_shuffle_epi32(sums, 0xFF);
    const __m256i fractions = running_sums(sums, totals, carry.chroma);
    return whole_parts(high_halves(even, odd), low, fractions,
                       mix.chroma_offsets);
}

/// Mixes 8 pairs into 32 bytes.
[[gnu::target("avx2")]] void mix_block(const std::uint32_t* words,
                                       unsigned char* groups, const Mix& mix,
                                       Carry& carry)
{
    const __m256 left = load_halves(words, words + 8);
    const __m256 right = load_halves(words + 4, words + 12);
    const Pixels first =
        pixels_of(_mm256_castps_si256(_mm256_shuffle_ps(left, right, 0x88)));
    const Pixels second =
        pixels_of(_mm256_castps_si256(_mm256_shuffle_ps(left, right, 0xDD)));
    const __m256i lumas = lumas_of(first, second, mix, carry.luma);
    const __m256i chromas = chromas_of(first, second, mix, carry);
    _mm256_storeu_si256(
        reinterpret_cast<__m256i*>(groups),
        _mm256_or_si256(_mm256_slli_epi16(lumas, 8),
                        _mm256_and_si256(chromas, _mm256_set1_epi16(0x00FF))));
}

[[gnu::target("avx2")]] Carry loaded(const VideoCarry& carry)
{
    return {_mm256_set1_epi16(static_cast<short>(carry.luma)),
            pair_of_words(static_cast<int>(carry.chroma[0]),
                          static_cast<int>(carry.chroma[1])),
            {_mm256_set1_epi32(carry.second[0]),
             _mm256_set1_epi32(carry.second[1])}};
}

[[gnu::target("avx2")]] VideoCarry stored(const Carry& carry)
{
    const auto lowest = [](__m256i lanes) __attribute__((target("avx2")))
    {
        return _mm256_cvtsi256_si32(lanes);
    };
    const std::uint32_t chroma =
        static_cast<std::uint32_t>(lowest(carry.chroma));
    return {static_cast<std::uint32_t>(lowest(carry.luma)) & 0xFFFF,
            {chroma & 0xFFFF, chroma >> 16},
            {lowest(carry.second[0]), lowest(carry.second[1])}};
}

/// Weights for two samples in each 32 bits: multiples of 65536, in these units,
/// and the rests, each of 16 bits.
struct SampleWeights
{
    __m256i multiples;
    __m256i rests;
};

[[gnu::target("avx2")]] SampleWeights sample_weights(int low, int high)
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
    __m256i luma_offset;   ///< In bytes, where the lumas are.
    __m256i chroma_offset; ///< In words.
};

[[gnu::target("avx2")]] Colors colors_of(const VideoColors& video)
{
    return {sample_weights(video.luma, 0),
            sample_weights(0, video.luma),
            sample_weights(video.red.first, video.red.second),
            sample_weights(video.green.first, video.green.second),
            sample_weights(video.blue.first, video.blue.second),
            _mm256_set1_epi16(static_cast<short>(video.luma_offset << 8)),
            _mm256_set1_epi16(static_cast<short>(video.chroma_offset))};
}

/// Gives the sums of two samples each, in 32 bits.
[[gnu::target("avx2")]] __m256i weighed(__m256i samples,
                                        const SampleWeights& weights)
{
    const __m256i wholes = _mm256_madd_epi16(samples, weights.multiples);
    return _mm256_add_epi32(_mm256_slli_epi32(wholes, 16),
                            _mm256_madd_epi16(samples, weights.rests));
}

/// Two sums for each group: of its first and of its second pixel.
struct Sums
{
    __m256i first;
    __m256i second;
};

/// Gives the whole parts of one channel of 16 pixels, in order.
[[gnu::target("avx2")]] __m256i channel_of(const Sums& lumas, __m256i chromas)
{
    return high_halves(_mm256_add_epi32(lumas.first, chromas),
                       _mm256_add_epi32(lumas.second, chromas));
}

/// Stores 16 pixels of channels that are not clamped yet, the lowest first.
[[gnu::target("avx2")]] void store_pixels(__m256i byte0, __m256i byte1,
                                          __m256i byte2, __m256i byte3,
                                          std::uint32_t* pixels)
{
    const __m256i even = _mm256_packus_epi16(byte0, byte2);
    const __m256i odd = _mm256_packus_epi16(byte1, byte3);
    const __m256i low_bytes = _mm256_unpacklo_epi8(even, odd);
    const __m256i high_bytes = _mm256_unpackhi_epi8(even, odd);
    const __m256i low = _mm256_unpacklo_epi16(low_bytes, high_bytes);
    const __m256i high = _mm256_unpackhi_epi16(low_bytes, high_bytes);
    auto* to = reinterpret_cast<__m256i*>(pixels);
    _mm256_storeu_si256(to, _mm256_permute2x128_si256(low, high, 0x20));
    _mm256_storeu_si256(to + 1, _mm256_permute2x128_si256(low, high, 0x31));
}

/// Makes 16 pixels of 8 groups.
template <bool red_lowest>
[[gnu::target("avx2")]] void color_block(const unsigned char* groups,
                                         std::uint32_t* pixels,
                                         const Colors& colors)
{
    const __m256i samples =
        _mm256_loadu_si256(reinterpret_cast<const __m256i*>(groups));
    const __m256i lumas =
        _mm256_srli_epi16(_mm256_subs_epu8(samples, colors.luma_offset), 8);
    const __m256i chromas =
        _mm256_sub_epi16(_mm256_and_si256(samples, _mm256_set1_epi16(0x00FF)),
                         colors.chroma_offset);
    const Sums grey = {weighed(lumas, colors.first_luma),
                       weighed(lumas, colors.second_luma)};
    const __m256i red = channel_of(grey, weighed(chromas, colors.red));
    const __m256i green = channel_of(grey, weighed(chromas, colors.green));
    const __m256i blue = channel_of(grey, weighed(chromas, colors.blue));
    const __m256i none = _mm256_setzero_si256();
    if (red_lowest)
        store_pixels(red, green, blue, none, pixels);
    else
        store_pixels(none, blue, green, red, pixels);
}

/// Makes pixels of as many groups as there are whole blocks of them.
///
/// Returns: the number of these groups.
template <bool red_lowest>
[[gnu::target("avx2")]] std::size_t
color_blocks(const unsigned char* groups, std::uint32_t* pixels,
             std::size_t pairs, const Colors& colors)
{
    std::size_t at = 0;
    for (; at + block_pairs <= pairs; at += block_pairs)
        color_block<red_lowest>(groups + 4 * at, pixels + 2 * at, colors);
    return at;
}

class Avx2VideoLanes final : public VideoLanes
{
public:
    const char* name() const override { return "avx2"; }

    [[gnu::target("avx2")]] void mix(const std::uint32_t* pixels,
                                     unsigned char* groups, std::size_t pairs,
                                     const VideoMix& video,
                                     VideoCarry& carry) const override
    {
        const Mix mix = mix_of(video);
        Carry wide = loaded(carry);
        std::size_t at = 0;
        for (; at + block_pairs <= pairs; at += block_pairs)
            mix_block(pixels + 2 * at, groups + 4 * at, mix, wide);
        carry = stored(wide);
        VideoLanes::mix(pixels + 2 * at, groups + 4 * at, pairs - at, video,
                        carry);
    }

    [[gnu::target("avx2")]] void color(const unsigned char* groups,
                                       std::uint32_t* pixels, std::size_t pairs,
                                       const VideoColors& video) const override
    {
        const Colors colors = colors_of(video);
        const std::size_t done =
            video.red_lowest
                ? color_blocks<true>(groups, pixels, pairs, colors)
                : color_blocks<false>(groups, pixels, pairs, colors);
        VideoLanes::color(groups + 4 * done, pixels + 2 * done, pairs - done,
                          video);
    }
};

constinit const Avx2VideoLanes avx2_lanes;

} // namespace

const VideoLanes* avx2_video_lanes()
{
    return processor_has_avx2() ? &avx2_lanes : nullptr;
}

} // namespace zt_platform

#else

namespace zt_platform {

const VideoLanes* avx2_video_lanes()
{
    return nullptr;
}

} // namespace zt_platform

#endif
