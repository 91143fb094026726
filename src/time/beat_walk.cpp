#include "time/beat_walk.h"

#include "ZT/timer.h"
#include "time/beat_context.h"

namespace zt_time {

namespace {

void advance(ZtTimer& timer)
{
    const KvoTime elapsed = ZtTimerBeat::global_tm - timer.clock_at_start;
    timer.current = timer.counting_up ? timer.position_at_start + elapsed
                                      : timer.position_at_start - elapsed;
    if (timer.end_mode != ZtTimer::StopsAtEnd)
        return;
    if (timer.counting_up ? timer.end <= timer.current
                          : timer.current <= timer.end) {
        timer.state = ZtTimer::Ended;
        timer.current = timer.end;
    }
}

bool has_reached(const ZtTimer& timer, KvoTime time)
{
    return timer.counting_up ? timer.current >= time : timer.current <= time;
}

void serve_trigger(ZtTimer* timer, ZtTimerCallbackInfo* trigger,
                   const RecordWalk& walk)
{
    if (trigger->fired || !has_reached(*timer, trigger->time))
        return;
    trigger->callback(timer, trigger->data);
    if (walk.goes_on())
        trigger->fired = 1;
}

void serve_repeat(ZtTimer* timer, ZtTimerCallbackInfo* repeat,
                  const RecordWalk& walk, std::int64_t milliseconds)
{
    const std::int64_t interval = repeat->interval;
    std::int64_t called_at = milliseconds;
    if (repeat->last_fired != -1) {
        // After the clock began again the latest call lies ahead of it.
        const std::int64_t last =
            repeat->last_fired > milliseconds ? 0 : repeat->last_fired;
        if (milliseconds - last < interval)
            return;
        if (interval > 0)
            called_at = milliseconds / interval * interval;
    }
    repeat->callback(timer, repeat->data);
    if (walk.goes_on())
        repeat->last_fired = called_at;
}

void serve_callbacks(ZtTimer* timer, std::int64_t milliseconds)
{
    const RecordWalk walk(timer);
    for (ZtTimerCallbackInfo* record = timer->callbacks; record;
         record = record->next) {
        if (!record->callback)
            continue;
        if (record->kind == ZtTimerCallbackInfo::Trigger)
            serve_trigger(timer, record, walk);
        else if (record->kind == ZtTimerCallbackInfo::Repeat)
            serve_repeat(timer, record, walk, milliseconds);
        if (!walk.goes_on())
            return;
    }
}

} // namespace

void advance_timers()
{
    for (ZtTimer* const timer : ZtTimerBeat::timers)
        if (timer && timer->state == ZtTimer::Running)
            advance(*timer);
}

void call_what_is_due(std::int64_t milliseconds)
{
    // It stays up for the slots that follow: when a timer ends, their triggers
    // are re-armed too.
    bool end_seen = false;
    for (ZtTimer* const& slot : ZtTimerBeat::timers) {
        ZtTimer* const timer = slot;
        if (!timer)
            continue;
        const int state = timer->state;
        if (state == ZtTimer::Ended) {
            timer->state = ZtTimer::Stopped;
            end_seen = true;
        }
        if (state == ZtTimer::Running || state == ZtTimer::Ended)
            serve_callbacks(timer, milliseconds);
        if (slot && end_seen)
            ZtTimerBeat::reset_callbacks_op(slot);
    }
}

void call_stop_callbacks(ZtTimer* timer)
{
    const ZtTimerCallbackInfo* last = timer->stop_callbacks;
    while (last && last->next)
        last = last->next;
    const RecordWalk walk(timer);
    for (ZtTimerCallbackInfo* record = timer->stop_callbacks; record;
         record = record->next) {
        if (record->callback)
            record->callback(timer, record->data);
        if (record == last || !walk.goes_on())
            return;
    }
}

} // namespace zt_time
