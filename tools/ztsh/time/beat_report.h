#ifndef ZTSH_TIME_BEAT_REPORT_H
#define ZTSH_TIME_BEAT_REPORT_H

/// \file
/// What the beat has measured, for people to read.

#include <ZT/timer.h>

#include <ostream>

namespace ztsh {

/// Writes how many beats there were, how late they came (median, 99th
/// percentile, longest), how many overran their period, and a bar for each
/// doubling of lateness from the least to the greatest that occurred.
///
/// Units: microseconds.
void WriteBeatReport(std::ostream& out,
                     const ZtTimerBeatStatistics& statistics);

} // namespace ztsh

#endif
