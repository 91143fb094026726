#include "BeatModel.h"

#include <algorithm>
#include <utility>

namespace {
std::int32_t wrapped(std::int64_t ticks)
{
    return static_cast<std::int32_t>(static_cast<std::uint32_t>(ticks));
}
} // namespace

void BeatModel::Make(int timer, std::int32_t start, std::int32_t end)
{
    timers[timer] = Timer();
    timers[timer].start = timers[timer].current = start;
    timers[timer].end = end;
    timers[timer].end_mode = end == 3 || end == -3 ? endless : stops_at_end;
    timers[timer].counting_up = start < end;
    Ask({Add, timer});
}

bool BeatModel::Destroy(int timer)
{
    bool found = false;
    for (int& slot : slots)
        if (slot == timer) {
            slot = -1;
            found = true;
        }
    for (Request& request : queue)
        if (request.timer == timer)
            request.timer = -1;
    return found;
}

void BeatModel::Ask(const Request& request)
{
    if (queue.size() < queue_limit)
        queue.push_back(request);
}

void BeatModel::AskToReverse(int timer)
{
    if (timers[timer].state == Stopped)
        Ask({Reverse, timer});
}

void BeatModel::PostStop(int timer, int callback, int data)
{
    timers[timer].stop_callbacks.push_back(
        {false, callback, data, false, 0, 0, timers[timer].current});
}

void BeatModel::Advance(Timer& timer) const
{
    const std::int64_t elapsed =
        wrapped(std::int64_t{clock} - timer.clock_at_start);
    timer.current = wrapped(timer.position_at_start +
                            (timer.counting_up ? elapsed : -elapsed));
    const bool over = timer.counting_up ? timer.end <= timer.current
                                        : timer.current <= timer.end;
    if (timer.end_mode == stops_at_end && over) {
        timer.state = Ended;
        timer.current = timer.end;
    }
}

void BeatModel::CallBack(int timer, const Record& record)
{
    const Call call = {timer, record.callback, record.data};
    calls.push_back(call);
    reactions.Called(*this, call);
}

void BeatModel::Serve(int timer, std::int64_t milliseconds)
{
    // Requests wait for the end of the beat, so the list stays as it is.
    for (Record& record : timers[timer].callbacks) {
        const Timer& its = timers[timer];
        if (!record.repeats) {
            const bool reached = its.counting_up ? its.current >= record.time
                                                 : its.current <= record.time;
            if (!record.fired && reached) {
                CallBack(timer, record);
                record.fired = true;
            }
        } else if (milliseconds - record.last_fired >= record.interval) {
            CallBack(timer, record);
            record.last_fired =
                milliseconds / record.interval * record.interval;
        }
    }
}

void BeatModel::Execute(const Request& request)
{
    if (request.timer < 0)
        return;
    Timer& timer = timers[request.timer];
    switch (request.code) {
    case ResetCallbacks:
        for (Record& record : timer.callbacks)
            record.fired = record.repeats && record.fired;
        break;
    case Add:
        *std::find(slots, slots + timer_count, -1) = request.timer;
        break;
    case Post:
        timer.callbacks.push_back(request.record);
        break;
    case Unpost: {
        const auto found =
            std::find_if(timer.callbacks.begin(), timer.callbacks.end(),
                         [&request](const Record& record) {
                             return record.callback == request.callback &&
                                    record.data == request.data;
                         });
        if (found != timer.callbacks.end())
            timer.callbacks.erase(found);
        break;
    }
    case Reverse:
        std::swap(timer.start, timer.end);
        timer.counting_up = timer.start < timer.end;
        break;
    case Start:
        if (timer.state == Running)
            break;
        timer.state = Running;
        timer.position_at_start = timer.current;
        timer.clock_at_start = clock;
        break;
    case Restart:
        timer.state = Running;
        timer.current = timer.position_at_start = timer.start;
        timer.clock_at_start = clock;
        break;
    case Stop: {
        if (timer.state != Running)
            break;
        timer.state = Stopped;
        const std::vector<Record> records = timer.stop_callbacks;
        for (const Record& record : records)
            CallBack(request.timer, record);
        break;
    }
    case Force:
        timer.current = request.time;
        if (timer.state == Running) {
            timer.position_at_start = request.time;
            timer.clock_at_start = clock;
        }
        break;
    }
}

void BeatModel::Beat(std::int64_t milliseconds)
{
    calls.clear();
    clock = wrapped(static_cast<std::int64_t>(
        static_cast<double>(static_cast<float>(milliseconds)) * 6.0));
    for (const int slot : slots)
        if (slot >= 0 && timers[slot].state == Running)
            Advance(timers[slot]);
    bool end_seen = false;
    for (const int slot : slots) {
        if (slot < 0)
            continue;
        const int state = timers[slot].state;
        if (state == Ended) {
            timers[slot].state = Stopped;
            end_seen = true;
        }
        if (state != Stopped)
            Serve(slot, milliseconds);
        if (end_seen)
            for (Record& record : timers[slot].callbacks)
                record.fired = record.repeats && record.fired;
    }
    for (std::size_t place = 0; place < queue.size(); ++place)
        Execute(Request(queue[place]));
    queue.clear();
}
