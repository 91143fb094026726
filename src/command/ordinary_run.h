#ifndef ZT_COMMAND_ORDINARY_RUN_H
#define ZT_COMMAND_ORDINARY_RUN_H

/// \file
/// Finds where runs of ordinary characters end, many characters at a time.
///
/// A character ends a run if it is a control character or the space, a quote,
/// the backslash, or one of four given stops.

#include <bit>
#include <cstdint>

#if defined(__SSE2__)
#include <emmintrin.h>
#endif

namespace zt_command {
constexpr int chunk_bytes = 16;
constexpr int block_bytes = 64;
constexpr int stop_count = 4;

/// The stops, each filling a chunk of its own.
using Stops = char[stop_count][chunk_bytes];

/// Gives a bit for each of the sixteen characters at `from` that ends a run,
/// the lowest for the first.
inline std::uint32_t ends_in_chunk(const char* from, const Stops& stops)
{
#if defined(__SSE2__)
    const auto load = [](const char* chunk) {
        return _mm_loadu_si128(reinterpret_cast<const __m128i*>(chunk));
    };
    const __m128i chunk = load(from);
    // At most a space, unsigned: the smaller of the two is the character.
    __m128i ends =
        _mm_cmpeq_epi8(_mm_min_epu8(chunk, _mm_set1_epi8(' ')), chunk);
    for (const char fixed : {'"', '\'', '\\'})
        ends = _mm_or_si128(ends, _mm_cmpeq_epi8(chunk, _mm_set1_epi8(fixed)));
    for (const auto& stop : stops)
        ends = _mm_or_si128(ends, _mm_cmpeq_epi8(chunk, load(stop)));
    return static_cast<std::uint32_t>(_mm_movemask_epi8(ends));
#else
    std::uint32_t ends = 0;
    for (int i = 0; i < chunk_bytes; ++i) {
        const char c = from[i];
        bool end = static_cast<unsigned char>(c) <= ' ' || c == '"' ||
                   c == '\'' || c == '\\';
        for (const auto& stop : stops)
            end = end || c == stop[0];
        ends |= std::uint32_t{end} << i;
    }
    return ends;
#endif
}

/// Does the same for the sixty-four characters at `from`.
inline std::uint64_t ends_in_block(const char* from, const Stops& stops)
{
    std::uint64_t ends = 0;
    for (int i = 0; i < block_bytes; i += chunk_bytes)
        ends |= std::uint64_t{ends_in_chunk(from + i, stops)} << i;
    return ends;
}

/// Steps over ordinary characters as long as a whole chunk is left.
///
/// Returns: the first character that ends a run, or where fewer than sixteen
///          are left before `limit`.
inline const char* skip_ordinary_chunks(const char* from, const char* limit,
                                        const Stops& stops)
{
    for (; limit - from >= chunk_bytes; from += chunk_bytes)
        if (const std::uint32_t ends = ends_in_chunk(from, stops))
            return from + std::countr_zero(ends);
    return from;
}
} // namespace zt_command

#endif
