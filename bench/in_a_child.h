#ifndef ZT_BENCH_IN_A_CHILD_H
#define ZT_BENCH_IN_A_CHILD_H

/// \file
/// Takes the time of what a process does for the first time, or what depends on
/// what the process did before.

#include <cstdio>
#include <cstdlib>
#include <ctime>
#include <sys/wait.h>
#include <unistd.h>

inline double Seconds()
{
    timespec now = {};
    clock_gettime(CLOCK_MONOTONIC, &now);
    return static_cast<double>(now.tv_sec) +
           static_cast<double>(now.tv_nsec) * 1e-9;
}

/// Has a child do `work` once, which tells whether it was done.
///
/// Returns: how long it took. Ends the program where it was not done.
template <class Work>
double SecondsInAChild(Work work)
{
    int ends[2] = {-1, -1};
    const bool connected = pipe(ends) == 0;
    const pid_t child = connected ? fork() : -1;
    if (child == 0) {
        const double begin = Seconds();
        const double spent = work() ? Seconds() - begin : 0;
        _exit(write(ends[1], &spent, sizeof spent) == sizeof spent ? 0 : 1);
    }
    double spent = 0;
    close(ends[1]);
    const bool read_whole =
        child > 0 && read(ends[0], &spent, sizeof spent) == sizeof spent;
    close(ends[0]);
    waitpid(child, nullptr, 0);
    if (read_whole && spent > 0)
        return spent;
    std::fprintf(stderr, "the child has not done its work\n");
    std::exit(1);
}

#endif
