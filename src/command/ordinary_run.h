#ifndef ZT_COMMAND_ORDINARY_RUN_H
#define ZT_COMMAND_ORDINARY_RUN_H

/// \file
/// Finds where runs of ordinary characters end, many characters at a time.
///
/// A run ends at a stop, which is a quote, the backslash, or one of three given
/// characters, and at a blank: any other control character or the space.

#include <bit>
#include <cstdint>

#include "platform/byte_chunk.h"

namespace zt_command {
using zt_platform::chunk_bytes;
constexpr int block_bytes = 64;
constexpr int given_stops = 3;

/// The given stops, each filling a chunk of its own.
using Stops = zt_platform::ByteChunks<given_stops>;

/// What ends runs in sixty-four characters: a bit for each of them, the lowest
/// for the first.
struct BlockMap
{
    std::uint64_t blanks;
    std::uint64_t stops;
};

inline std::uint32_t stops_in_chunk(const char* from, const Stops& stops)
{
    constexpr char quotes[] = {'"', '\'', '\\'};
    return zt_platform::find_in_chunk(from, quotes, stops);
}

/// Maps the sixty-four characters at `from`.
inline BlockMap map_of_block(const char* from, const Stops& stops)
{
    std::uint64_t low = 0, found = 0;
    for (int i = 0; i < block_bytes; i += chunk_bytes) {
        low |= std::uint64_t{zt_platform::find_low_in_chunk(from + i, ' ')}
               << i;
        found |= std::uint64_t{stops_in_chunk(from + i, stops)} << i;
    }
    return {low & ~found, found};
}

/// Steps over ordinary characters as long as a whole chunk is left.
///
/// Returns: the first character that ends a run, or where fewer than sixteen
///          are left before `limit`.
inline const char* skip_ordinary_chunks(const char* from, const char* limit,
                                        const Stops& stops)
{
    for (; limit - from >= chunk_bytes; from += chunk_bytes)
        if (const std::uint32_t ends =
                zt_platform::find_low_in_chunk(from, ' ') |
                stops_in_chunk(from, stops))
            return from + std::countr_zero(ends);
    return from;
}
} // namespace zt_command

#endif
