#ifndef ZT_TIME_BEAT_ALARM_H
#define ZT_TIME_BEAT_ALARM_H

/// \file
/// The alarm as the beat sets it, and the care that none gets lost: one that
/// falls due while the signal is ignored would have been the last.

#include <cstdint>

namespace zt_time {

/// Sets the alarm, and `ZtTimerBeat::itimer` with it.
///
/// Units: `microseconds` from now, below 1 counts as 1; `steady_now` is now on
///        the steady clock.
void set_alarm(std::int64_t microseconds, std::uint64_t steady_now);

/// Takes note that the alarm has come.
///
/// Returns: how much too late, in microseconds.
std::int64_t take_alarm(std::uint64_t steady_now);

/// Sets an alarm that fell due while it was ignored anew, to come at once.
///
/// Context: while signals are held back and the alarm is not ignored.
void repair_lost_alarm();

} // namespace zt_time

#endif
