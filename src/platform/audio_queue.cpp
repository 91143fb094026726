#include "platform/audio_queue.h"

#include <algorithm>
#include <bit>
#include <cstring>

#include "platform/pages.h"

namespace zt_platform {

namespace {

/// Calls `move(place, offset, count)` for the one or two stretches of the ring
/// that `count` samples from number `first` on take up.
template <class Move>
void for_stretches(std::uint32_t first, std::uint32_t count,
                   std::uint32_t places, Move move)
{
    const std::uint32_t place = first & (places - 1);
    const std::uint32_t before_end = std::min(count, places - place);
    move(place, 0U, before_end);
    if (count > before_end)
        move(0U, before_end, count - before_end);
}

std::uint32_t clamped(long count, long most)
{
    return static_cast<std::uint32_t>(std::clamp(count, 0L, most));
}

} // namespace

AudioQueue::~AudioQueue()
{
    Pages::current().unmap(ring, places * sizeof *ring);
}

bool AudioQueue::make(long capacity)
{
    const std::uint32_t wanted =
        std::bit_ceil(2 * clamped(capacity, most_capacity));
    if (capacity < 1 || capacity > most_capacity)
        return false;
    if (wanted > places) {
        Pages& pages = Pages::current();
        pages.unmap(ring, places * sizeof *ring);
        ring = static_cast<std::int16_t*>(pages.map(wanted * sizeof *ring));
        places = ring ? wanted : 0;
    }
    limit = ring ? capacity : 0;
    written = 0;
    discarded = 0;
    taken = 0;
    return ring;
}

long AudioQueue::write(const std::int16_t* from, long count)
{
    const std::uint32_t end = written.load(std::memory_order_relaxed);
    const std::uint32_t passed = taken.load(std::memory_order_acquire);
    // A mark that is left far behind would seem to lie ahead one day.
    if (front(passed) == passed)
        discarded.store(passed, std::memory_order_release);
    const long free = limit - static_cast<long>(end - front(passed));
    const long room = static_cast<long>(places - (end - passed));
    const std::uint32_t moved = clamped(count, std::min(free, room));
    if (moved == 0)
        return 0;
    for_stretches(
        end, moved, places,
        [&](std::uint32_t place, std::uint32_t offset, std::uint32_t part) {
            std::memcpy(ring + place, from + offset, part * sizeof *ring);
        });
    written.store(end + moved, std::memory_order_release);
    return moved;
}

void AudioQueue::discard()
{
    discarded.store(written.load(std::memory_order_relaxed),
                    std::memory_order_release);
}

long AudioQueue::read(std::int16_t* to, long count)
{
    const std::uint32_t begin = front(taken.load(std::memory_order_relaxed));
    const std::uint32_t end = written.load(std::memory_order_acquire);
    const std::uint32_t moved = clamped(count, static_cast<long>(end - begin));
    if (moved != 0)
        for_stretches(
            begin, moved, places,
            [&](std::uint32_t place, std::uint32_t offset, std::uint32_t part) {
                std::memcpy(to + offset, ring + place, part * sizeof *ring);
            });
    taken.store(begin + moved, std::memory_order_release);
    return moved;
}

long AudioQueue::drop(long count)
{
    const std::uint32_t begin = front(taken.load(std::memory_order_relaxed));
    const std::uint32_t end = written.load(std::memory_order_acquire);
    const std::uint32_t dropped =
        clamped(count, static_cast<long>(end - begin));
    taken.store(begin + dropped, std::memory_order_release);
    return dropped;
}

} // namespace zt_platform
