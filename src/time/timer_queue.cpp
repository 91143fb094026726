#include "time/timer_queue.h"

#include <algorithm>
#include <utility>

#include "diag/signal_report.h"
#include "time/beat_context.h"
#include "time/beat_walk.h"
#include "time/callback_store.h"

constinit ZtTimerDeferOp ZtTimerBeat::defer_ops[defer_op_limit] = {};
constinit volatile int ZtTimerBeat::defer_op_count = 0;

namespace {
using Op = ZtTimerDeferOp;
using zt_diag::SignalReport;
using zt_time::BeatHeld;

constexpr int error = 4;
constexpr int most_reports = 100;

constinit SignalReport too_many("Error: ", "Too many timers in ZtTimerBeat.\n",
                                error);
constinit SignalReport
    not_found("Error: ", "Failed to find timer in ZtTimerBeat.\n", error);

// The queue is carried out once at a time. Where it stands is kept here, so
// that a drain which a callback left by a jump does nothing twice.
constinit bool draining = false;
constinit int drained = 0;

int queued()
{
    const int count = ZtTimerBeat::defer_op_count;
    return std::clamp(count, 0, int{ZtTimerBeat::defer_op_limit});
}

// Returns: false when the queue is full.
bool append(const Op& request)
{
    const BeatHeld held;
    const int place = queued();
    if (place == ZtTimerBeat::defer_op_limit)
        return false;
    ZtTimerBeat::defer_ops[place] = request;
    ZtTimerBeat::defer_op_count = place + 1;
    return true;
}

bool request(Op::Code code, ZtTimer* timer)
{
    Op op;
    op.op = code;
    op.timer = timer;
    return append(op);
}

void work(const Op& op)
{
    switch (op.op) {
    case Op::ResetCallbacks:
        return ZtTimerBeat::reset_callbacks_op(op.timer);
    case Op::Add:
        return ZtTimerBeat::add_timer_op(op.timer);
    case Op::PostCallback:
        return ZtTimerBeat::post_callback_op(op.timer, op.info);
    case Op::UnpostCallback:
        return ZtTimerBeat::unpost_callback_op(op.timer, op.callback, op.data);
    case Op::Reverse:
        return ZtTimerBeat::reverse_op(op.timer);
    case Op::Start:
        return ZtTimerBeat::start_op(op.timer);
    case Op::Restart:
        return ZtTimerBeat::restart_op(op.timer);
    case Op::Stop:
        return ZtTimerBeat::stop_op(op.timer);
    case Op::Force:
        return ZtTimerBeat::force_op(op.timer, op.time);
    case Op::Destroy:
        return ZtTimerBeat::destroy_op(op.timer);
    default:
        return;
    }
}

int waiting_for_a_slot()
{
    int waiting = 0;
    for (int place = 0; place < queued(); ++place)
        waiting += ZtTimerBeat::defer_ops[place].op == Op::Add;
    return waiting;
}

// Returns: false when there is no empty slot.
bool take_slot(ZtTimer* timer)
{
    const BeatHeld held;
    for (ZtTimer*& slot : ZtTimerBeat::timers)
        if (!slot) {
            slot = timer;
            return true;
        }
    return false;
}

// Returns: false when no slot held the timer.
bool leave_slots(const ZtTimer* timer)
{
    const BeatHeld held;
    bool found = false;
    for (ZtTimer*& slot : ZtTimerBeat::timers)
        if (slot == timer) {
            slot = nullptr;
            found = true;
        }
    return found;
}

void start_from(ZtTimer* timer, KvoTime position)
{
    timer->current = position;
    timer->state = ZtTimer::Running;
    timer->position_at_start = position;
    timer->clock_at_start = ZtTimerBeat::global_tm;
}
} // namespace

void zt_time::reserve_reports(int timer_count)
{
    not_found.reserve(std::min(timer_count, most_reports));
}

void zt_time::withdraw_requests(const ZtTimer* timer)
{
    const BeatHeld held;
    for (int place = drained; place < queued(); ++place) {
        Op& op = ZtTimerBeat::defer_ops[place];
        if (op.timer != timer)
            continue;
        if (op.op == Op::PostCallback)
            free_callback(std::exchange(op.info, nullptr));
        op.timer = nullptr;
    }
}

void zt_time::forget_abandoned_drain()
{
    draining = false;
}

void ZtTimerBeat::q_op(ZtTimerDeferOp* request)
{
    append(*request);
}

void ZtTimerBeat::execute_ops()
{
    if (draining)
        return;
    const zt_time::CalledBeatScope scope;
    draining = true;
    while (drained < queued())
        execute_op(&defer_ops[drained++]);
    drained = 0;
    defer_op_count = 0;
    draining = false;
}

void ZtTimerBeat::execute_op(ZtTimerDeferOp* request)
{
    const zt_time::CalledBeatScope scope;
    if (!request->timer)
        return;
    // A caller's own block stays as it is.
    const bool blocks = blocked_count == 0;
    if (blocks)
        block();
    work(*request);
    if (blocks)
        unblock();
}

void ZtTimerBeat::tmr_reset_callbacks(ZtTimer* timer)
{
    request(Op::ResetCallbacks, timer);
}

void ZtTimerBeat::tmr_add(ZtTimer* timer)
{
    too_many.reserve(waiting_for_a_slot() + 1);
    request(Op::Add, timer);
}

void ZtTimerBeat::tmr_post_callback(ZtTimer* timer, ZtTimerCallbackInfo* info)
{
    Op op;
    op.op = Op::PostCallback;
    op.timer = timer;
    op.info = info;
    if (!append(op))
        zt_time::free_callback(info);
}

void ZtTimerBeat::tmr_unpost_callback(ZtTimer* timer, ZtTimerCallback callback,
                                      void* data)
{
    Op op;
    op.op = Op::UnpostCallback;
    op.timer = timer;
    op.callback = callback;
    op.data = data;
    append(op);
}

void ZtTimerBeat::tmr_reverse(ZtTimer* timer)
{
    request(Op::Reverse, timer);
}

void ZtTimerBeat::tmr_start(ZtTimer* timer)
{
    request(Op::Start, timer);
}

void ZtTimerBeat::tmr_restart(ZtTimer* timer)
{
    request(Op::Restart, timer);
}

void ZtTimerBeat::tmr_stop(ZtTimer* timer)
{
    request(Op::Stop, timer);
}

void ZtTimerBeat::tmr_force(ZtTimer* timer, KvoTime time)
{
    Op op;
    op.op = Op::Force;
    op.timer = timer;
    op.time = time;
    append(op);
}

void ZtTimerBeat::tmr_destroy(ZtTimer* timer)
{
    destroy_op(timer);
}

void ZtTimerBeat::reset_callbacks_op(ZtTimer* timer)
{
    for (ZtTimerCallbackInfo* record = timer->callbacks; record;
         record = record->next)
        if (record->kind == ZtTimerCallbackInfo::Trigger)
            record->fired = 0;
}

void ZtTimerBeat::add_timer_op(ZtTimer* timer)
{
    if (!take_slot(timer))
        too_many.post();
}

void ZtTimerBeat::post_callback_op(ZtTimer* timer, ZtTimerCallbackInfo* info)
{
    zt_time::append_callback(timer->callbacks, info);
}

void ZtTimerBeat::unpost_callback_op(ZtTimer* timer, ZtTimerCallback callback,
                                     void* data)
{
    const BeatHeld held;
    ZtTimerCallbackInfo** link = &timer->callbacks;
    while (*link && ((*link)->callback != callback || (*link)->data != data))
        link = &(*link)->next;
    if (ZtTimerCallbackInfo* const record = *link) {
        *link = record->next;
        zt_time::free_callback(record);
    }
}

void ZtTimerBeat::reverse_op(ZtTimer* timer)
{
    std::swap(timer->start_time, timer->end);
    timer->counting_up = timer->start_time < timer->end;
}

void ZtTimerBeat::start_op(ZtTimer* timer)
{
    if (timer->state != ZtTimer::Running)
        start_from(timer, timer->current);
}

void ZtTimerBeat::restart_op(ZtTimer* timer)
{
    start_from(timer, timer->start_time);
}

void ZtTimerBeat::stop_op(ZtTimer* timer)
{
    if (timer->state != ZtTimer::Running)
        return;
    const zt_time::CalledBeatScope scope;
    timer->state = ZtTimer::Stopped;
    zt_time::call_stop_callbacks(timer);
}

void ZtTimerBeat::force_op(ZtTimer* timer, KvoTime time)
{
    timer->current = time;
    if (timer->state == ZtTimer::Running) {
        timer->position_at_start = time;
        timer->clock_at_start = global_tm;
    }
}

void ZtTimerBeat::destroy_op(ZtTimer* timer)
{
    if (!leave_slots(timer))
        not_found.post();
}
