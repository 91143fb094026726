#include "time/callback_store.h"

#include <type_traits>

#include "platform/pages.h"
#include "time/beat_context.h"

namespace zt_time {

namespace {

struct Place
{
    ZtTimerCallbackInfo record;
    Place* following; ///< In the list of free or of freed places.
};

static_assert(std::is_standard_layout_v<Place>,
              "a place begins where its record does");

constexpr std::size_t places_at_once = 1024;

constinit Place* free_places = nullptr;
constinit Place* freed_in_beat = nullptr;
constinit Place* uncut = nullptr; ///< The rest of the latest pages.
constinit std::size_t uncut_count = 0;

void put(Place*& list, Place* place)
{
    place->following = list;
    list = place;
}

Place* cut_one()
{
    if (uncut_count == 0) {
        uncut = static_cast<Place*>(
            zt_platform::Pages::current().map(places_at_once * sizeof(Place)));
        if (!uncut)
            return nullptr;
        uncut_count = places_at_once;
    }
    --uncut_count;
    return uncut++;
}

} // namespace

void* take_callback_place()
{
    const BeatHeld held;
    Place* place = free_places;
    if (place)
        free_places = place->following;
    else
        place = cut_one();
    return place;
}

void give_callback_place_back(void* freed)
{
    const BeatHeld held;
    if (freed)
        put(in_beat() ? freed_in_beat : free_places,
            static_cast<Place*>(freed));
}

void reuse_freed_callback_places()
{
    while (Place* const place = freed_in_beat) {
        freed_in_beat = place->following;
        put(free_places, place);
    }
}

void append_callback(ZtTimerCallbackInfo*& list, ZtTimerCallbackInfo* record)
{
    const BeatHeld held;
    ZtTimerCallbackInfo** link = &list;
    while (*link && *link != record)
        link = &(*link)->next;
    if (*link || !record)
        return;
    record->next = nullptr;
    *link = record;
}

void free_callback(ZtTimerCallbackInfo* record)
{
    if (record)
        record->callback = nullptr;
    give_callback_place_back(record);
}

void free_callbacks(ZtTimerCallbackInfo*& list)
{
    const BeatHeld held;
    while (ZtTimerCallbackInfo* const record = list) {
        list = record->next;
        free_callback(record);
    }
}

} // namespace zt_time

void* ZtTimerCallbackInfo::operator new(std::size_t) noexcept
{
    return zt_time::take_callback_place();
}

void ZtTimerCallbackInfo::operator delete(void* record) noexcept
{
    zt_time::give_callback_place_back(record);
}
