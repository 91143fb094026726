#ifndef ZT_BENCH_REQUIRE_H
#define ZT_BENCH_REQUIRE_H

/// \file
/// What every benchmark asks before it takes the time: are the results right?

#include <cstdio>
#include <cstdlib>

/// Ends the program unless ours and the literal form gave the same.
///
/// The time of a wrong result is worth nothing, and must not reach a table.
inline void Require(bool same, const char* what)
{
    if (same)
        return;
    std::fprintf(stderr, "%s: ours differs from the literal form\n", what);
    std::exit(1);
}

#endif
