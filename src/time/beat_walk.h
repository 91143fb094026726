#ifndef ZT_TIME_BEAT_WALK_H
#define ZT_TIME_BEAT_WALK_H

/// \file
/// The two passes of a beat over the table of timers, and its callbacks.

#include <cstdint>

class ZtTimer;

namespace zt_time {

/// Brings the current time of every running timer up to the beat's clock, and
/// marks those that have reached their end.
void advance_timers();

/// Calls the triggers and repeats that are due, slot by slot.
///
/// Units: `milliseconds` of the beat's clock since `load`.
void call_what_is_due(std::int64_t milliseconds);

/// Calls the stop callbacks that the timer has now, in order.
void call_stop_callbacks(ZtTimer* timer);

} // namespace zt_time

#endif
