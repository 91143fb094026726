#ifndef ZT_TESTS_LITERALTIMECODE_H
#define ZT_TESTS_LITERALTIMECODE_H

/// \file
/// The timecode formulas written down with no care for speed: what the quick
/// versions are held against, in the tests and in the benchmarks.

#include <iomanip>
#include <ostream>

struct LiteralTimecode
{
    long hours;
    int minutes;
    int seconds;
    int frames;

    friend bool operator==(const LiteralTimecode& a, const LiteralTimecode& b)
    {
        return a.hours == b.hours && a.minutes == b.minutes &&
               a.seconds == b.seconds && a.frames == b.frames;
    }

    friend std::ostream& operator<<(std::ostream& out,
                                    const LiteralTimecode& code)
    {
        return out << code.hours << ' ' << code.minutes << ' ' << code.seconds
                   << ' ' << code.frames;
    }
};

/// Splits ticks in the width of long.
///
/// Requires: a rate of 1 to 6000, or the same below 0.
inline LiteralTimecode LiteralSplit(long ticks, int fps)
{
    const long hours = ticks / 21600000;
    long rest = ticks - hours * 21600000;
    const long minutes = rest / 360000;
    rest -= minutes * 360000;
    const long seconds = rest / 6000;
    rest -= seconds * 6000;
    return {hours, static_cast<int>(minutes), static_cast<int>(seconds),
            static_cast<int>(rest / (6000 / fps))};
}

/// Writes the parts with the stream's own means.
inline void LiteralWrite(std::ostream& out, const LiteralTimecode& code)
{
    const char fill = out.fill('0');
    out << std::setw(2) << code.hours << ':' << std::setw(2) << code.minutes
        << ':' << std::setw(2) << code.seconds << ':' << std::setw(2)
        << code.frames;
    out.fill(fill);
}

#endif
