#ifndef ZT_PLATFORM_BYTE_CHUNK_H
#define ZT_PLATFORM_BYTE_CHUNK_H

/// \file
/// Sixteen bytes looked at together, as every processor of one family can; on
/// others one after the other, with the same answers.

#include <cstdint>

#if defined(__SSE2__)
#include <emmintrin.h>
#endif

namespace zt_platform {
constexpr int chunk_bytes = 16;

/// Wanted bytes, each filling a chunk of its own.
template <int count>
using ByteChunks = char[count][chunk_bytes];

#if defined(__SSE2__)
inline __m128i load_chunk(const char* from)
{
    return _mm_loadu_si128(reinterpret_cast<const __m128i*>(from));
}
#endif

/// Finds among the sixteen bytes at `from` those that are at most `low`,
/// unsigned.
///
/// Returns: a bit for each such byte, the lowest for the first.
inline std::uint32_t find_low_in_chunk(const char* from, char low)
{
#if defined(__SSE2__)
    // At most `low`: the smaller of the two is the byte itself.
    const __m128i chunk = load_chunk(from);
    const __m128i smaller = _mm_min_epu8(chunk, _mm_set1_epi8(low));
    return static_cast<std::uint32_t>(
        _mm_movemask_epi8(_mm_cmpeq_epi8(smaller, chunk)));
#else
    std::uint32_t found = 0;
    for (int i = 0; i < chunk_bytes; ++i)
        found |= std::uint32_t{static_cast<unsigned char>(from[i]) <=
                               static_cast<unsigned char>(low)}
                 << i;
    return found;
#endif
}

/// Finds among the sixteen bytes at `from` those that are one of `fixed` or of
/// `wanted`.
///
/// Returns: a bit for each such byte, the lowest for the first.
template <int fixed_count, int wanted_count>
inline std::uint32_t find_in_chunk(const char* from,
                                   const char (&fixed)[fixed_count],
                                   const ByteChunks<wanted_count>& wanted)
{
#if defined(__SSE2__)
    const __m128i chunk = load_chunk(from);
    __m128i found = _mm_setzero_si128();
    for (const char byte : fixed)
        found = _mm_or_si128(found, _mm_cmpeq_epi8(chunk, _mm_set1_epi8(byte)));
    for (const auto& bytes : wanted)
        found = _mm_or_si128(found, _mm_cmpeq_epi8(chunk, load_chunk(bytes)));
    return static_cast<std::uint32_t>(_mm_movemask_epi8(found));
#else
    std::uint32_t found = 0;
    for (int i = 0; i < chunk_bytes; ++i) {
        bool is_one = false;
        for (const char byte : fixed)
            is_one = is_one || from[i] == byte;
        for (const auto& bytes : wanted)
            is_one = is_one || from[i] == bytes[0];
        found |= std::uint32_t{is_one} << i;
    }
    return found;
#endif
}
} // namespace zt_platform

#endif
