#include "ZT/timer.h"

#include "time/beat_context.h"
#include "time/callback_store.h"
#include "time/timer_queue.h"

constinit int ZtTimer::tmr_count = 0;

namespace {
// An end of so many ticks, either way, makes a timer endless.
constexpr int endless_ticks = 3;

constinit int timers_alive = 0;

bool means_endless(KvoTime end)
{
    return end.Ticks() == endless_ticks || end.Ticks() == -endless_ticks;
}

/// What is to be posted; a record of it is made with the beat held back.
struct Posting
{
    ZtTimerCallbackInfo::Kind kind;
    ZtTimerCallback callback;
    void* data;
    long interval;
    KvoTime time;
};

// Returns: null when there is no memory.
ZtTimerCallbackInfo* make_record(const Posting& posting)
{
    auto* const record = new ZtTimerCallbackInfo;
    if (record) {
        record->kind = posting.kind;
        record->callback = posting.callback;
        record->data = posting.data;
        record->interval = posting.interval;
        record->time = posting.time;
    }
    return record;
}

void post(ZtTimer* timer, const Posting& posting)
{
    const zt_time::BeatHeld held;
    if (ZtTimerCallbackInfo* const record = make_record(posting))
        ZtTimerBeat::tmr_post_callback(timer, record);
}
} // namespace

ZtTimer::ZtTimer() : ZtTimer(KvoTime::ZERO, KvoTime::FromTicks(endless_ticks))
{}

ZtTimer::ZtTimer(KvoTime start_at, KvoTime end_at)
    : id(tmr_count++), state(Stopped),
      end_mode(means_endless(end_at) ? Endless : StopsAtEnd),
      counting_up(start_at < end_at), start_time(start_at), end(end_at),
      current(start_at), callbacks(nullptr), stop_callbacks(nullptr)
{
    zt_time::reserve_reports(++timers_alive);
    ZtTimerBeat::tmr_add(this);
}

ZtTimer::~ZtTimer()
{
    {
        const zt_time::BeatHeld held;
        zt_time::withdraw_requests(this);
        zt_time::RecordWalk::end(this);
        zt_time::free_callbacks(callbacks);
        zt_time::free_callbacks(stop_callbacks);
        --timers_alive;
    }
    ZtTimerBeat::tmr_destroy(this);
}

void ZtTimer::reset_callbacks()
{
    ZtTimerBeat::tmr_reset_callbacks(this);
}

void ZtTimer::post_repeat(ZtTimerCallback callback, void* data, long interval)
{
    post(this,
         {ZtTimerCallbackInfo::Repeat, callback, data, interval, KvoTime()});
}

void ZtTimer::post_trigger(ZtTimerCallback callback, void* data, KvoTime time)
{
    post(this, {ZtTimerCallbackInfo::Trigger, callback, data, 0, time});
}

void ZtTimer::post_stop(ZtTimerCallback callback, void* data)
{
    const zt_time::BeatHeld held;
    zt_time::append_callback(stop_callbacks,
                             make_record({ZtTimerCallbackInfo::Trigger,
                                          callback, data, 0, current}));
}

void ZtTimer::unpost(ZtTimerCallback callback, void* data)
{
    ZtTimerBeat::tmr_unpost_callback(this, callback, data);
}

void ZtTimer::reverse()
{
    if (state == Stopped)
        ZtTimerBeat::tmr_reverse(this);
}

void ZtTimer::start()
{
    ZtTimerBeat::tmr_start(this);
}

void ZtTimer::restart()
{
    ZtTimerBeat::tmr_restart(this);
}

void ZtTimer::stop()
{
    ZtTimerBeat::tmr_stop(this);
}

void ZtTimer::force(KvoTime time)
{
    ZtTimerBeat::tmr_force(this, time);
}
