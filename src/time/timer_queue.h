#ifndef ZT_TIME_TIMER_QUEUE_H
#define ZT_TIME_TIMER_QUEUE_H

/// \file
/// What the queue of requests does beside queueing.

#include "ZT/timer.h"

namespace zt_time {

/// Makes ready what the beat has to report when this many timers are destroyed
/// inside it.
///
/// Context: does nothing inside the beat.
void reserve_reports(int timer_count);

/// Withdraws what is queued for a timer: its entries keep their places and do
/// nothing.
void withdraw_requests(const ZtTimer* timer);

/// Lets the queue be carried out again after that was left by a jump; it goes
/// on with the request after the one that was left.
void forget_abandoned_drain();

} // namespace zt_time

#endif
