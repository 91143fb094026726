#ifndef ZT_SOUND_TOKEN_POOL_H
#define ZT_SOUND_TOKEN_POOL_H

/// \file
/// Records that a timer's callbacks find by a number, not by their address, so
/// that one that comes late does nothing.

#include <cstdint>

#include "time/beat_context.h"

namespace zt_sound {

/// A fixed number of places for records, each with a number that changes when
/// the record goes.
///
/// Context: may be used inside the beat.
template <class Record, unsigned size>
class TokenPool
{
public:
    /// Gives a fresh record, null when all places are taken.
    Record* take()
    {
        const zt_time::BeatHeld held;
        for (Place& place : places)
            if (!place.taken) {
                place.taken = true;
                place.generation = place.generation % last_generation + 1;
                place.record.begin();
                return &place.record;
            }
        return nullptr;
    }

    /// Gives the number of a record that is taken.
    void* token_of(const Record* record) const
    {
        std::uintptr_t index = 0;
        while (&places[index].record != record)
            ++index;
        // NOLINTNEXTLINE(performance-no-int-to-ptr): never followed
        return reinterpret_cast<void*>(
            (std::uintptr_t{places[index].generation} << index_bits) | index);
    }

    /// Gives the record of this number.
    ///
    /// Returns: null for a number that none has.
    Record* find(void* token)
    {
        const auto number = reinterpret_cast<std::uintptr_t>(token);
        const std::uintptr_t index = number & (most_places - 1);
        if (index >= std::uintptr_t{size} || !places[index].taken ||
            places[index].generation != number >> index_bits)
            return nullptr;
        return &places[index].record;
    }

    void give_back(Record* record)
    {
        const zt_time::BeatHeld held;
        for (Place& place : places)
            if (&place.record == record)
                place.taken = false;
    }

    /// Calls `look(record)` for every record that is taken.
    template <class Look>
    void for_each(Look look)
    {
        for (Place& place : places)
            if (place.taken)
                look(place.record);
    }

    int taken_count() const
    {
        int count = 0;
        for (const Place& place : places)
            count += place.taken;
        return count;
    }

private:
    static constexpr int index_bits = 8;
    static constexpr std::uintptr_t most_places = 1 << index_bits;
    static constexpr std::uint32_t last_generation = (1 << 24) - 1;
    static_assert(size <= most_places);

    struct Place
    {
        Record record;
        std::uint32_t generation = 0;
        bool taken = false;
    };

    Place places[size] = {};
};

} // namespace zt_sound

#endif
