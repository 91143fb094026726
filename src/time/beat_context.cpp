#include "time/beat_context.h"

#include "time/beat_alarm.h"
#include "time/callback_store.h"
#include "time/timer_queue.h"

namespace zt_time {

constinit volatile int BeatHeld::depth = 0;
constinit RecordWalk* RecordWalk::innermost = nullptr;

namespace {
// Where the stack stood when the outermost scope began.
constinit const void* volatile outermost_frame = nullptr;
} // namespace

BeatScope::BeatScope() : outermost(!in_beat())
{
    if (outermost)
        outermost_frame = __builtin_frame_address(0);
}

BeatScope::~BeatScope()
{
    if (!outermost)
        return;
    reuse_freed_callback_places();
    outermost_frame = nullptr;
}

CalledBeatScope::CalledBeatScope() : from_ordinary_code(!in_beat()) {}

// What it encloses blocks the beat and thereby throws away an alarm that was
// held back.
CalledBeatScope::~CalledBeatScope()
{
    if (from_ordinary_code && ZtTimerBeat::blocked_count == 0)
        repair_lost_alarm();
}

RecordWalk::RecordWalk(const ZtTimer* walked) : timer(walked), outer(innermost)
{
    innermost = this;
}

RecordWalk::~RecordWalk()
{
    innermost = outer;
}

void RecordWalk::end(const ZtTimer* destroyed)
{
    for (RecordWalk* walk = innermost; walk; walk = walk->outer)
        if (walk->timer == destroyed)
            walk->timer = nullptr;
}

bool beat_was_abandoned()
{
    return outermost_frame && __builtin_frame_address(0) > outermost_frame;
}

void forget_abandoned_beat()
{
    zt_diag::SignalScope::forget_all();
    BeatHeld::depth = 0;
    RecordWalk::innermost = nullptr;
    outermost_frame = nullptr;
    ZtTimerBeat::danger = 0;
    forget_abandoned_drain();
    reuse_freed_callback_places();
}

} // namespace zt_time
