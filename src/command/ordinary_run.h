#ifndef ZT_COMMAND_ORDINARY_RUN_H
#define ZT_COMMAND_ORDINARY_RUN_H

/// \file
/// Finds the end of a run of ordinary characters sixteen at a time.
///
/// A character ends the run if it is a control character or the space, a quote,
/// the backslash, or one of four given stops. On machines without the
/// instructions for it, chunks are looked at character by character with the
/// same result.

#if defined(__SSE2__)
#include <emmintrin.h>
#endif

#include <cstring>

namespace zt_command {
constexpr int chunk_bytes = 16;
constexpr int stop_count = 4;

/// The stops, each filling a chunk of its own.
using Stops = char[stop_count][chunk_bytes];

#if defined(__SSE2__)

/// Gives a bit for each of the characters at `from` that ends a run.
inline unsigned ends_in_chunk(__m128i chunk, const Stops& stops)
{
    // At most a space, unsigned: the smaller of the two is the character.
    __m128i end =
        _mm_cmpeq_epi8(_mm_min_epu8(chunk, _mm_set1_epi8(' ')), chunk);
    for (const char fixed : {'"', '\'', '\\'})
        end = _mm_or_si128(end, _mm_cmpeq_epi8(chunk, _mm_set1_epi8(fixed)));
    for (const auto& stop : stops)
        end = _mm_or_si128(
            end,
            _mm_cmpeq_epi8(chunk, _mm_loadu_si128(
                                      reinterpret_cast<const __m128i*>(stop))));
    return static_cast<unsigned>(_mm_movemask_epi8(end));
}

/// Copies the sixteen characters at `from` to `to`.
///
/// Returns: how many of them stand before the first that ends a run.
inline int copy_ordinary_chunk(char* to, const char* from, const Stops& stops)
{
    const __m128i chunk =
        _mm_loadu_si128(reinterpret_cast<const __m128i*>(from));
    _mm_storeu_si128(reinterpret_cast<__m128i*>(to), chunk);
    const unsigned ends = ends_in_chunk(chunk, stops);
    return ends ? __builtin_ctz(ends) : chunk_bytes;
}

/// Steps over chunks of ordinary characters as long as a whole one is left.
///
/// Returns: the first character that ends a run, or where fewer than sixteen
///          are left before `limit`.
inline const char* skip_ordinary_chunks(const char* from, const char* limit,
                                        const Stops& stops)
{
    for (; limit - from >= chunk_bytes; from += chunk_bytes) {
        const unsigned ends = ends_in_chunk(
            _mm_loadu_si128(reinterpret_cast<const __m128i*>(from)), stops);
        if (ends)
            return from + __builtin_ctz(ends);
    }
    return from;
}

#else

inline bool ends_run(char character, const Stops& stops)
{
    for (const auto& stop : stops)
        if (character == stop[0])
            return true;
    return static_cast<unsigned char>(character) <= ' ' || character == '"' ||
           character == '\'' || character == '\\';
}

inline int copy_ordinary_chunk(char* to, const char* from, const Stops& stops)
{
    std::memcpy(to, from, chunk_bytes);
    int bytes = 0;
    while (bytes < chunk_bytes && !ends_run(from[bytes], stops))
        ++bytes;
    return bytes;
}

inline const char* skip_ordinary_chunks(const char* from, const char* limit,
                                        const Stops& stops)
{
    while (limit - from >= chunk_bytes && !ends_run(*from, stops))
        ++from;
    return from;
}

#endif
} // namespace zt_command

#endif
