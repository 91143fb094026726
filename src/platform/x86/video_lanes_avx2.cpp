#include "platform/x86/video_lanes_avx2.h"

#if defined(__x86_64__) || defined(__i386__)

#include <immintrin.h>

// Fractions carried from sum to sum are a running sum modulo 65536 of the
// sums' own low halves, so they need no waiting for each other: 16 of them are
// added up in lanes of 16 bits, in steps of 1, 2, 4 and 8 lanes. A sum gains
// one in its high half exactly where the running sum has wrapped, that is
// where it is less than what was added last.
//
// The lumas of 8 pairs fill a register in order, first, second, first, second;
// so do the two chromas. That is also the order of the bytes in the groups.

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
};

constinit const Avx2VideoLanes avx2_lanes;

} // namespace

const VideoLanes* avx2_video_lanes()
{
    __builtin_cpu_init(); // Static objects may ask before it was done.
    return __builtin_cpu_supports("avx2") ? &avx2_lanes : nullptr;
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
