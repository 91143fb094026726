#include "platform/x86/sample_lanes_avx512.h"

#include "platform/x86/sample_lanes_avx2.h"

#if defined(__x86_64__) || defined(__i386__)

#include "platform/x86/processor.h"

#include <immintrin.h>

#if !defined(__clang__)
// g++ 12 takes the undefined registers of its own header for faults.
#pragma GCC diagnostic ignored "-Wmaybe-uninitialized"
#pragma GCC diagnostic ignored "-Wuninitialized"
#endif

namespace zt_platform {

namespace {

constexpr std::size_t block = 32; ///< Samples of a register.
constexpr std::size_t half = 16;  ///< Samples as numbers of a register.

[[gnu::target("avx512f,avx512bw")]] __m512i load(const void* from)
{
    return _mm512_loadu_si512(from);
}

/// Gives 16 samples as floating-point numbers.
[[gnu::target("avx512f,avx512bw")]] __m512 numbers_at(const short* samples)
{
    return _mm512_cvtepi32_ps(_mm512_cvtepi16_epi32(
        _mm256_loadu_si256(reinterpret_cast<const __m256i*>(samples))));
}

/// Gives the numbers of the words that have this many bits below them in each
/// of 16 pairs of samples.
template <int bits_below>
[[gnu::target("avx512f,avx512bw")]] __m512 numbers_of(__m512i pairs)
{
    constexpr int word_bits = 16;
    return _mm512_cvtepi32_ps(_mm512_srai_epi32(
        bits_below ? pairs : _mm512_slli_epi32(pairs, word_bits), word_bits));
}

[[gnu::target("avx512f,avx512bw")]] __m512i
weighed(__m512 now, __m512 before, __m512 of_now, __m512 of_before)
{
    return _mm512_add_epi32(
        _mm512_cvttps_epi32(_mm512_mul_ps(now, of_now)),
        _mm512_cvttps_epi32(_mm512_mul_ps(before, of_before)));
}

/// Weighs samples with the ones directly before them, in pairs of samples: the
/// first of a pair is the one before the second, and is converted once.
///
/// Returns: how many of the first samples are left.
[[gnu::target("avx512f,avx512bw")]] std::size_t
weigh_neighbours(const short* samples, short* to, std::size_t count,
                 __m512 of_now, __m512 of_before)
{
    constexpr int high_word = 16;
    constexpr __mmask32 second_words = 0xAAAAAAAA;
    std::size_t left = count;
    // What is read begins two samples ahead.
    while (left > block) {
        const std::size_t at = left - block;
        const __m512i pairs = load(samples + at);
        const __m512 before = numbers_of<high_word>(load(samples + at - 2));
        const __m512 first = numbers_of<0>(pairs);
        const __m512 second = numbers_of<high_word>(pairs);
        const __m512i firsts = weighed(first, before, of_now, of_before);
        const __m512i seconds = weighed(second, first, of_now, of_before);
        _mm512_storeu_si512(
            to + at,
            _mm512_mask_blend_epi16(second_words, firsts,
                                    _mm512_slli_epi32(seconds, high_word)));
        left = at;
    }
    return left;
}

class Avx512SampleLanes final : public Avx2SampleLanes
{
public:
    const char* name() const override { return "avx512"; }

    [[gnu::target("avx512f,avx512bw")]] void
    weigh(const short* now, const short* before, short* to, std::size_t count,
          float now_factor, float before_factor) const override
    {
        const __m512 of_now = _mm512_set1_ps(now_factor);
        const __m512 of_before = _mm512_set1_ps(before_factor);
        std::size_t left = count;
        if (before + 1 == now)
            left = weigh_neighbours(now, to, count, of_now, of_before);
        while (left >= half) {
            const std::size_t at = left - half;
            const __m512i sums =
                weighed(numbers_at(now + at), numbers_at(before + at), of_now,
                        of_before);
            _mm256_storeu_si256(reinterpret_cast<__m256i*>(to + at),
                                _mm512_cvtepi32_epi16(sums));
            left = at;
        }
        Avx2SampleLanes::weigh(now, before, to, left, now_factor,
                               before_factor);
    }
};

constinit const Avx512SampleLanes avx512_lanes;

} // namespace

const SampleLanes* avx512_sample_lanes()
{
    return processor_has_avx512() && avx2_sample_lanes() ? &avx512_lanes
                                                         : nullptr;
}

} // namespace zt_platform

#else

namespace zt_platform {

const SampleLanes* avx512_sample_lanes()
{
    return nullptr;
}

} // namespace zt_platform

#endif
