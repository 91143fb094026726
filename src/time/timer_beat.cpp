#include "ZT/timer.h"

#include <iostream>
#include <string>

#include "core/write_text.h"
#include "platform/alarm.h"
#include "platform/clock.h"
#include "time/beat_alarm.h"
#include "time/beat_context.h"
#include "time/beat_statistics.h"
#include "time/beat_walk.h"

// All of it is ready before any code runs and is never destroyed: timers may be
// static objects, and the last beat may come while the process exits.
constinit ZtTimer* ZtTimerBeat::timers[timer_limit] = {};
constinit volatile int ZtTimerBeat::danger = 0;
constinit volatile int ZtTimerBeat::blocked_count = 0;
constinit ZtSignalHandler ZtTimerBeat::sigfunc = nullptr;
constinit volatile int ZtTimerBeat::reload_flag = 0;
constinit int ZtTimerBeat::sample_rate = 4000;
constinit itimerval ZtTimerBeat::itimer = {};
constinit timeval ZtTimerBeat::start_timeval = {};
constinit struct timezone ZtTimerBeat::start_timezone = {};
constinit timeval ZtTimerBeat::current_timeval = {};
constinit struct timezone ZtTimerBeat::current_timezone = {};
constinit timeval ZtTimerBeat::bstart_timeval = {};
constinit struct timezone ZtTimerBeat::bstart_timezone = {};
constinit timeval ZtTimerBeat::bcurrent_timeval = {};
constinit struct timezone ZtTimerBeat::bcurrent_timezone = {};
constinit KvoTime ZtTimerBeat::global_tm;
constinit KvoTime ZtTimerBeat::global_start_tm;

namespace {
using zt_platform::Alarm;
using zt_platform::AlarmDisposition;
using zt_platform::Clock;
using zt_time::BeatHeld;

constexpr std::int64_t second = 1000000; // in microseconds

/// What `block` has put aside for `unblock`.
struct PutAside
{
    AlarmDisposition disposition;
    bool present;
};

constinit PutAside put_aside = {};
constinit ZtTimerBeatStatistics statistics = {};
constinit std::uint64_t steady_at_load = 0;

std::int64_t milliseconds_between(const timeval& from, const timeval& to)
{
    return (static_cast<std::int64_t>(to.tv_sec) - from.tv_sec) * 1000 +
           (to.tv_usec - from.tv_usec) / 1000;
}

/// The wall clock as it would show if nobody had set it since `load`.
timeval wall_since_load(std::uint64_t steady)
{
    const std::uint64_t passed =
        steady > steady_at_load ? (steady - steady_at_load) / 1000 : 0;
    const std::int64_t microseconds =
        ZtTimerBeat::start_timeval.tv_usec + static_cast<std::int64_t>(passed);
    timeval now = {};
    now.tv_sec = static_cast<time_t>(ZtTimerBeat::start_timeval.tv_sec +
                                     microseconds / second);
    now.tv_usec = static_cast<suseconds_t>(microseconds % second);
    return now;
}

// In 64 bits, and then wrapped: the ticks of a clock that started late in the
// day leave their range after three days.
KvoTime clock_after(std::int64_t milliseconds)
{
    const double ticks =
        static_cast<double>(static_cast<float>(milliseconds)) * 6.0;
    return ZtTimerBeat::global_start_tm +
           KvoTime::FromTicks(static_cast<std::int32_t>(
               static_cast<std::uint32_t>(static_cast<std::int64_t>(ticks))));
}

void on_alarm(int);

void arm_next(const timeval& began)
{
    const std::uint64_t steady = Clock::current().steady_nanoseconds();
    const std::int64_t spent =
        milliseconds_between(began, wall_since_load(steady));
    const std::int64_t wait =
        ZtTimerBeat::sample_rate - 1000 * (spent > 0 ? spent : 0);
    if (wait <= 0)
        ++statistics.overruns;
    // A beat that ordinary code calls in a block of its own leaves it blocked.
    if (ZtTimerBeat::blocked_count == 0)
        Alarm::current().listen(on_alarm);
    zt_time::set_alarm(wait, steady);
}

/// One beat, inside a `BeatScope`.
void beat(std::uint64_t steady)
{
    const int danger_before = ZtTimerBeat::danger;
    const int blocked_before = ZtTimerBeat::blocked_count;
    ZtTimerBeat::danger = 1;
    ZtTimerBeat::blocked_count = blocked_before + 1;

    const timeval began = wall_since_load(steady);
    const std::int64_t milliseconds =
        milliseconds_between(ZtTimerBeat::start_timeval, began);
    ZtTimerBeat::current_timeval = began;
    ZtTimerBeat::global_tm = clock_after(milliseconds);
    zt_time::advance_timers();
    zt_time::call_what_is_due(milliseconds);

    ZtTimerBeat::blocked_count = blocked_before;
    ZtTimerBeat::danger = danger_before;
    ZtTimerBeat::execute_ops();
    if (ZtTimerBeat::reload_flag)
        arm_next(began);
}

void on_alarm(int)
{
    if (zt_time::in_beat()) {
        // A callback has let the alarm through: the beat that it belongs to
        // arms the next one.
        if (!zt_time::beat_was_abandoned())
            return;
        zt_time::forget_abandoned_beat();
    }
    const zt_time::BeatScope scope;
    const std::uint64_t steady = Clock::current().steady_nanoseconds();
    zt_time::note_beat(statistics, zt_time::take_alarm(steady));
    beat(steady);
}
} // namespace

void ZtTimerBeat::load()
{
    const BeatHeld held;
    Alarm& alarm = Alarm::current();
    Clock& clock = Clock::current();
    alarm.own();
    alarm.silence_at_exit();
    alarm.listen(on_alarm);

    const zt_platform::DayTime day =
        zt_platform::local_day_time(clock.wall().tv_sec);
    global_tm.SetTimecode(day.hour, day.minute, day.second, 0, 0);
    global_start_tm = global_tm;
    start_timeval = clock.wall();
    steady_at_load = clock.steady_nanoseconds();
    statistics = {};
    zt_time::set_alarm(sample_rate, steady_at_load);
}

void ZtTimerBeat::reload(int microseconds)
{
    const BeatHeld held;
    Alarm::current().listen(on_alarm);
    zt_time::set_alarm(microseconds, Clock::current().steady_nanoseconds());
}

void ZtTimerBeat::start()
{
    if (zt_time::beat_was_abandoned())
        zt_time::forget_abandoned_beat();
    {
        const BeatHeld held;
        load();
        reload_flag = 1;
        blocked_count = 0;
        put_aside.present = false;
    }
    if (!zt_time::in_beat())
        Alarm::current().let_through();
}

void ZtTimerBeat::stop()
{
    reload_flag = 0;
}

void ZtTimerBeat::block()
{
    if (blocked_count != 0)
        return;
    put_aside.disposition = Alarm::current().ignore();
    sigfunc = put_aside.disposition.function;
    put_aside.present = true;
    blocked_count = 1;
}

void ZtTimerBeat::unblock()
{
    if (blocked_count < 1)
        return;
    blocked_count = blocked_count - 1;
    if (blocked_count != 0 || !put_aside.present)
        return;
    const BeatHeld held;
    put_aside.present = false;
    put_aside.disposition.function = sigfunc;
    Alarm::current().restore(put_aside.disposition);
    if (!zt_time::in_beat())
        zt_time::repair_lost_alarm();
}

ZtTimer* ZtTimerBeat::list_find(int id)
{
    for (ZtTimer* const timer : timers)
        if (timer && timer->id == id)
            return timer;
    return nullptr;
}

void ZtTimerBeat::fire(int, int, sigcontext*)
{
    const zt_time::CalledBeatScope scope;
    beat(Clock::current().steady_nanoseconds());
}

const ZtTimerBeatStatistics& ZtTimerBeat::Statistics()
{
    return statistics;
}

void checktimer()
{
    const zt_platform::AlarmLeft left = Alarm::current().left();
    const std::string text = "Itimer " + std::to_string(left.seconds) + " " +
                             std::to_string(left.microseconds) + "\n";
    zt_core::write_text(std::cerr, text.c_str());
}
