#include "time/beat_alarm.h"

#include "ZT/timer.h"
#include "platform/alarm.h"

namespace zt_time {

namespace {
constexpr std::int64_t second = 1000000; // in microseconds

constinit std::uint64_t due = 0; // on the steady clock
// Set, and it has not come yet.
constinit volatile bool owed = false;
} // namespace

void set_alarm(std::int64_t microseconds, std::uint64_t steady_now)
{
    const std::int64_t wait = microseconds > 1 ? microseconds : 1;
    itimerval once = {};
    once.it_value.tv_sec = static_cast<time_t>(wait / second);
    once.it_value.tv_usec = static_cast<suseconds_t>(wait % second);
    ZtTimerBeat::itimer = once;
    due = steady_now + static_cast<std::uint64_t>(wait) * 1000;
    owed = true;
    zt_platform::Alarm::current().arm(wait);
}

std::int64_t take_alarm(std::uint64_t steady_now)
{
    owed = false;
    return static_cast<std::int64_t>(steady_now - due) / 1000;
}

void repair_lost_alarm()
{
    if (!owed)
        return;
    zt_platform::Alarm& alarm = zt_platform::Alarm::current();
    const zt_platform::AlarmLeft left = alarm.left();
    if (left.seconds == 0 && left.microseconds == 0 && !alarm.waiting())
        ZtTimerBeat::reload(1);
}

} // namespace zt_time
