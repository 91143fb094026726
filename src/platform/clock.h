#ifndef ZT_PLATFORM_CLOCK_H
#define ZT_PLATFORM_CLOCK_H

/// \file
/// The two clocks of the system: the one on the wall, which people set, and
/// the steady one, which nobody does.

#include <cstdint>
#include <sys/time.h>

namespace zt_platform {

/// The system's clocks.
class Clock
{
public:
    /// Gives the time since the beginning of 1970.
    ///
    /// Units:   `tv_usec` is 0 to 999999. The clock may be set back between
    ///          two readings.
    /// Context: neither allocates nor locks; allowed inside the beat.
    virtual timeval wall() = 0;

    /// Gives the time since some moment before the process began.
    ///
    /// Units:   never less than at the reading before.
    /// Context: neither allocates nor locks; allowed inside the beat.
    virtual std::uint64_t steady_nanoseconds() = 0;

    /// Waits on the steady clock until the whole time has passed, however
    /// many signals arrive meanwhile.
    ///
    /// Context: must not run inside the beat.
    virtual void sleep_nanoseconds(std::uint64_t nanoseconds) = 0;

    /// Gives the clocks in use: the system's, or those that a test installed.
    static Clock& current();

    /// Installs other clocks; null restores the system's.
    ///
    /// Owner:   the caller, who installs others before destroying them.
    /// Returns: what was installed before, null for the system's.
    static Clock* install(Clock* other);

protected:
    ~Clock() = default;
};

/// A time of the day.
struct DayTime
{
    int hour;
    int minute;
    int second;
};

/// Gives the time of the day, in this process's time zone, of a moment that
/// `Clock::wall` told.
///
/// Returns: midnight for a moment that has no date.
/// Context: must not run inside the beat.
DayTime local_day_time(time_t moment);

} // namespace zt_platform

#endif
