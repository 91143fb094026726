#ifndef ZT_PLATFORM_UNPACK_ROWS_H
#define ZT_PLATFORM_UNPACK_ROWS_H

/// \file
/// How `PixelLanes::unpack` goes about it, whatever the width of registers.
///
/// `Wide` has three static functions, whose calls end up in the function that
/// unpacks: `copy` and `fill` write up to 127 bytes, and may write 128 and read
/// as many; `join` joins `Wide::block` words.

#include "platform/pixel_lanes.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>

namespace zt_platform {

/// Joins a few words at a time.
template <class Wide>
class JoinBeside
{
public:
    [[gnu::always_inline]] explicit JoinBeside(const Joining& joining)
        : bytes{joining.bytes[0], joining.bytes[1], joining.bytes[2],
                joining.bytes[3]},
          words(joining.words), count(joining.count), at(0)
    {}

    /// Joins the next `some` words, whole blocks, as far as they go.
    [[gnu::always_inline]] void join(std::size_t some)
    {
        std::size_t end = std::min(at + some, count);
        for (; at + Wide::block <= end; at += Wide::block) {
            call_for(words + at);
            Wide::join(bytes, at, words + at);
        }
    }

    /// Joins all that is left.
    [[gnu::always_inline]] void finish(const PixelLanes& lanes)
    {
        join(count);
        if (at < count)
            lanes.join(
                {bytes[0] + at, bytes[1] + at, bytes[2] + at, bytes[3] + at},
                words + at, count - at);
    }

private:
    static constexpr std::size_t line = 64;    ///< Bytes that come together.
    static constexpr std::size_t ahead = 1024; ///< Bytes from here to there.

    /// Calls for the memory that is joined into in a while: the processor does
    /// so by itself only while nothing else is done.
    [[gnu::always_inline]] static void call_for(const std::uint32_t* block)
    {
        const std::uintptr_t there =
            reinterpret_cast<std::uintptr_t>(block) + ahead;
        for (std::size_t i = 0; i < Wide::block * sizeof *block; i += line)
            // NOLINTNEXTLINE(performance-no-int-to-ptr): never followed
            __builtin_prefetch(reinterpret_cast<const void*>(there + i), 1);
    }

    const unsigned char* bytes[4];
    std::uint32_t* words;
    std::size_t count;
    std::size_t at; ///< How many are joined.
};

/// A row on its way. It stays in registers: in memory it would wait for all
/// the words that are on their way there before it.
template <class Wide>
class Unpacking
{
public:
    [[gnu::always_inline]] explicit Unpacking(const PackedRow& row)
        : packets(row.packets), packets_end(row.packets_end),
          values(row.values), values_end(row.values_end)
    {}

    bool unfinished() const
    {
        return values < values_end && packets < packets_end;
    }

    /// Unpacks a packet.
    ///
    /// Returns: how many values it gave.
    [[gnu::always_inline]] std::size_t next()
    {
        const unsigned packet = *packets;
        const std::size_t count = packet & PackedRow::count_bits;
        if (count == 0) {
            packets_end = packets;
        } else if (packet & PackedRow::literal_bit) {
            Wide::copy(values, packets + 1, count);
            packets += 1 + count;
        } else {
            Wide::fill(values, packets[1], count);
            packets += 2;
        }
        values += count;
        return count;
    }

    /// Tells whether the packets filled the row exactly, once it is finished.
    bool is_exact() const
    {
        return values == values_end &&
               (packets == packets_end ||
                (packets < packets_end &&
                 (*packets & PackedRow::count_bits) == 0));
    }

private:
    const unsigned char* packets;
    const unsigned char* packets_end;
    unsigned char* values;
    unsigned char* values_end;
};

/// Unpacks a packet of each row in turn: where a long packet ends nobody can
/// guess, and so four are waited for at a time.
template <class Wide>
[[gnu::always_inline]] inline bool unpack_in_turn(const PackedRow (&packed)[4],
                                                  JoinBeside<Wide>& beside)
{
    constexpr std::size_t joined_a_turn = 64;
    Unpacking<Wide> rows[4] = {
        Unpacking<Wide>(packed[0]), Unpacking<Wide>(packed[1]),
        Unpacking<Wide>(packed[2]), Unpacking<Wide>(packed[3])};
    bool unfinished = true;
    while (unfinished) {
        unfinished = false;
#pragma GCC unroll 4
        for (Unpacking<Wide>& row : rows)
            if (row.unfinished()) {
                row.next();
                unfinished = true;
            }
        beside.join(joined_a_turn);
    }
    return rows[0].is_exact() && rows[1].is_exact() && rows[2].is_exact() &&
           rows[3].is_exact();
}

/// Unpacks one row after the other: short packets come in long series that are
/// guessed right, and so the fewest steps a packet win.
template <class Wide>
[[gnu::always_inline]] inline bool unpack_in_order(const PackedRow (&packed)[4],
                                                   JoinBeside<Wide>& beside)
{
    constexpr std::size_t joined_at_a_time = 256;
    constexpr std::size_t rows_of_most = 3;
    bool exact = true;
    for (const PackedRow& one : packed) {
        Unpacking<Wide> row(one);
        std::size_t left = joined_at_a_time;
        while (row.unfinished()) {
            const std::size_t count = row.next();
            if (count >= left) {
                beside.join(joined_at_a_time);
                left += rows_of_most * joined_at_a_time;
            }
            left -= count;
        }
        exact = exact && row.is_exact();
    }
    return exact;
}

template <class Wide>
[[gnu::always_inline]] inline bool
unpack_rows(const PixelLanes& lanes, const PackedRow (&rows)[4],
            PixelLanes::Packets packets, const Joining& joining)
{
    JoinBeside<Wide> beside(joining);
    const bool exact = packets == PixelLanes::Packets::Long
                           ? unpack_in_turn(rows, beside)
                           : unpack_in_order(rows, beside);
    beside.finish(lanes);
    return exact;
}

} // namespace zt_platform

#endif
