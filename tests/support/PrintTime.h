#ifndef ZT_TESTS_PRINTTIME_H
#define ZT_TESTS_PRINTTIME_H

#include <KVO/KvoTime.h>

#include <ostream>

/// Lets a failed comparison show a time as its ticks.
inline void PrintTo(KvoTime time, std::ostream* out)
{
    *out << time.Ticks() << " ticks";
}

#endif
