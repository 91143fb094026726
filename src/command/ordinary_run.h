#ifndef ZT_COMMAND_ORDINARY_RUN_H
#define ZT_COMMAND_ORDINARY_RUN_H

/// \file
/// Finds where runs of ordinary characters end, many characters at a time.
///
/// A character ends a run if it is a control character or the space, a quote,
/// the backslash, or one of four given stops.

#include <bit>
#include <cstdint>

#include "platform/byte_chunk.h"

namespace zt_command {
using zt_platform::chunk_bytes;
constexpr int block_bytes = 64;
constexpr int stop_count = 4;

/// The stops, each filling a chunk of its own.
using Stops = zt_platform::ByteChunks<stop_count>;

/// Gives a bit for each of the sixteen characters at `from` that ends a run,
/// the lowest for the first.
inline std::uint32_t ends_in_chunk(const char* from, const Stops& stops)
{
    constexpr char quotes[] = {'"', '\'', '\\'};
    return zt_platform::find_in_chunk(from, ' ', quotes, stops);
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
