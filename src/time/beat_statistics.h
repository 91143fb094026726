#ifndef ZT_TIME_BEAT_STATISTICS_H
#define ZT_TIME_BEAT_STATISTICS_H

/// \file
/// How the beat writes down what it measures.

#include "ZT/timer.h"

namespace zt_time {
/// Counts a beat. A beat before its time counts as punctual.
void note_beat(ZtTimerBeatStatistics& statistics,
               std::int64_t late_microseconds);
} // namespace zt_time

#endif
